// The library's main export: processes every product registered for updates.
#pragma once
#include "entry/mendler_api.h"
#include "entry/progress_data.h"

// Hosts look it up by this plain name. Always returns false.
extern "C" MENDLER_API bool UpdateAll(ProgressCallback callback);

// Sets the host's six update-schedule dates to the empty text (existing keys only).
void ResetUpdateScheduleDates();
