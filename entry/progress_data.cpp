#include "entry/progress_data.h"

#include <cstring>

CProgressData g_ProgressData;

CProgressData::CProgressData()
    : StatusText{}, StatusTextSet(false), TotalSteps(0), TotalStepsSet(false), CurrentStep(0),
      CurrentStepSet(false), ItemTotal(0), ItemTotalSet(false), ItemDone(0), ItemDoneSet(false) {}

void CProgressData::SetStatusText(const char* text) {
    std::strncpy(StatusText, text ? text : "", sizeof StatusText - 1);
    StatusText[sizeof StatusText - 1] = '\0';
    StatusTextSet = true;
}

void CProgressData::SetStatusText(const std::string& text) { SetStatusText(text.c_str()); }

void CProgressData::SetTotalSteps(std::int32_t value) {
    TotalSteps = value;
    TotalStepsSet = true;
}

void CProgressData::IncrementCurrentStep() {
    ++CurrentStep;
    CurrentStepSet = true;
}

void CProgressData::SetItemTotal(std::int32_t value) {
    ItemTotal = value;
    ItemTotalSet = true;
}

void CProgressData::SetItemDone(std::int32_t value) {
    ItemDone = value;
    ItemDoneSet = true;
}
