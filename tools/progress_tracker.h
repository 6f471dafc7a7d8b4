// Works out, from the library's one progress record, where the run stands for a person: which
// product of how many, and that product's own steps against its total. The record's CurrentStep
// counts every step of the process (products and their work alike) and is never reset, so the
// product's steps are counted from where the product started.
#pragma once
#include <cstdint>
#include <string>

#include "entry/progress_data.h"

namespace pextool {

struct ProgressView {
    std::int32_t product = 0;        // 1-based product of the UpdateAll run; 0 outside one
    std::int32_t productCount = 0;   // 0 when not run through UpdateAll
    std::int32_t step = 0;           // the product's steps done, never more than stepTotal
    std::int32_t stepTotal = 0;      // 0 until the product's analysis has counted its work
    std::string status;
};

class ProgressTracker {
public:
    ProgressView Observe(const CProgressData& record);

private:
    void ObserveBetweenProducts(const CProgressData& record, std::int32_t moved);
    void ObserveInProduct(const CProgressData& record);

    bool seen_ = false;
    bool inProduct_ = false;
    bool totalKnown_ = false;
    std::int32_t lastStep_ = 0;
    std::int32_t stepBase_ = 0;
    std::int32_t totalAtEntry_ = 0;
    ProgressView view_;
};

}  // namespace pextool
