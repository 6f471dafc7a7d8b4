#include "tools/progress_tracker.h"

#include <algorithm>
#include <cstring>

namespace pextool {

namespace {

// What ProcessUpdateInformation says at its start and at its end.
constexpr const char* kProductStart = "Analyzing data...";
constexpr const char* kProductEnd = "Finished.";

bool StartsWith(const char* text, const char* prefix) { return std::strncmp(text, prefix, std::strlen(prefix)) == 0; }

}  // namespace

ProgressView ProgressTracker::Observe(const CProgressData& record) {
    // The first record seen may carry the steps of runs made earlier in the process.
    const std::int32_t moved = seen_ ? record.CurrentStep - lastStep_ : 0;
    seen_ = true;
    lastStep_ = record.CurrentStep;
    const char* status = record.StatusTextSet ? record.StatusText : "";
    if (!inProduct_ && std::strcmp(status, kProductStart) == 0) {
        inProduct_ = true;
        totalKnown_ = false;
        stepBase_ = record.CurrentStep;
        totalAtEntry_ = record.TotalSteps;
        view_.step = view_.stepTotal = 0;
    }
    if (inProduct_)
        ObserveInProduct(record);
    else
        ObserveBetweenProducts(record, moved);
    if (inProduct_ && std::strcmp(status, kProductEnd) == 0) inProduct_ = false;
    view_.status = status;
    return view_;
}

// UpdateAll sets the number of products without moving the step, then moves it once per product.
void ProgressTracker::ObserveBetweenProducts(const CProgressData& record, std::int32_t moved) {
    if (moved == 0) {
        view_.productCount = record.TotalSteps;
        view_.product = 0;
    } else {
        view_.product = std::min(view_.product + std::max(moved, 0), view_.productCount);
    }
    view_.step = view_.stepTotal = 0;
}

// Until the analysis has set the product's total, TotalSteps still holds the number of products.
// The total is the product's once it changes, or once the product has gone past its analysis
// (a total equal to the number of products does not change the value). A product without a
// content file ends with no total of its own.
void ProgressTracker::ObserveInProduct(const CProgressData& record) {
    if (!totalKnown_)
        totalKnown_ = record.TotalSteps != totalAtEntry_ || record.CurrentStep != stepBase_ ||
                      !(StartsWith(record.StatusText, "Analyzing ") || std::strcmp(record.StatusText, kProductEnd) == 0);
    if (!totalKnown_) return;
    view_.stepTotal = std::max(record.TotalSteps, 0);
    view_.step = std::clamp(record.CurrentStep - stepBase_, 0, view_.stepTotal);
}

}  // namespace pextool
