// The progress record that every stage of the library reports through. Hosts read its fields
// directly, so their order and widths are part of the exported interface.
#pragma once
#include <cstddef>
#include <cstdint>
#include <string>

#include "entry/mendler_api.h"

class MENDLER_API CProgressData {
public:
    CProgressData();  // every value zero, every flag clear

    // Copies at most 255 characters and always terminates.
    void SetStatusText(const char* text);
    void SetStatusText(const std::string& text);
    void SetTotalSteps(std::int32_t value);
    void IncrementCurrentStep();
    void SetItemTotal(std::int32_t value);
    void SetItemDone(std::int32_t value);

    char StatusText[256];
    bool StatusTextSet;
    std::int32_t TotalSteps;
    bool TotalStepsSet;
    std::int32_t CurrentStep;
    bool CurrentStepSet;
    std::int32_t ItemTotal;
    bool ItemTotalSet;
    std::int32_t ItemDone;
    bool ItemDoneSet;
};

static_assert(offsetof(CProgressData, StatusText) == 0);
static_assert(offsetof(CProgressData, StatusTextSet) == 256);
static_assert(offsetof(CProgressData, TotalSteps) == 260);
static_assert(offsetof(CProgressData, TotalStepsSet) == 264);
static_assert(offsetof(CProgressData, CurrentStep) == 268);
static_assert(offsetof(CProgressData, CurrentStepSet) == 272);
static_assert(offsetof(CProgressData, ItemTotal) == 276);
static_assert(offsetof(CProgressData, ItemTotalSet) == 280);
static_assert(offsetof(CProgressData, ItemDone) == 284);
static_assert(offsetof(CProgressData, ItemDoneSet) == 288);
static_assert(sizeof(CProgressData) == 292);

// The host's progress callback; may be null. Its result is ignored.
typedef bool (*ProgressCallback)(CProgressData* progress);

// The one progress record of the process, passed to every callback call.
extern CProgressData g_ProgressData;

// Calls the callback with the process-wide record when there is one.
inline void ReportProgress(ProgressCallback callback) {
    if (callback) callback(&g_ProgressData);
}
