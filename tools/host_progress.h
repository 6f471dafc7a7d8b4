// The host's progress display: a bar on a terminal, plain lines otherwise, nothing when quiet.
#pragma once
#include "entry/progress_data.h"

namespace pextool {

enum class ProgressStyle { Bar, Lines, Quiet };

// Bar when standard output is a terminal, Lines otherwise; Quiet when asked.
ProgressStyle ChooseProgressStyle(bool quiet);
void SetProgressStyle(ProgressStyle style);

// The callback handed to the library.
bool ShowProgress(CProgressData* progress);

// Ends the bar's line, if one is drawn.
void FinishProgress();

}  // namespace pextool
