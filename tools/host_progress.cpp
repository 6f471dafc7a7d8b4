#include "tools/host_progress.h"

#include <unistd.h>

#include <cstdio>
#include <string>

#include "tools/progress_tracker.h"

namespace pextool {

namespace {

ProgressStyle g_style = ProgressStyle::Lines;
std::string g_lastStatus;
bool g_barDrawn = false;

std::string Bar(std::int64_t done, std::int64_t total, int width) {
    if (total <= 0) return std::string(static_cast<size_t>(width), ' ');
    if (done > total) done = total;
    if (done < 0) done = 0;
    const int filled = static_cast<int>(done * width / total);
    return std::string(static_cast<size_t>(filled), '#') + std::string(static_cast<size_t>(width - filled), '.');
}

ProgressTracker g_tracker;

void DrawBar(const CProgressData& p) {
    const ProgressView view = g_tracker.Observe(p);
    std::string line = "[" + Bar(view.step, view.stepTotal, 30) + "] " + std::to_string(view.step) + "/" +
                       (view.stepTotal > 0 ? std::to_string(view.stepTotal) : std::string("?")) + " ";
    if (view.productCount > 0)
        line += "product " + std::to_string(view.product) + " of " + std::to_string(view.productCount) + " ";
    if (p.ItemTotalSet && p.ItemTotal > 0 && p.ItemDone < p.ItemTotal)
        line += "[" + Bar(p.ItemDone, p.ItemTotal, 12) + "] ";
    line += p.StatusText;
    if (line.size() > 110) line.resize(110);
    std::printf("\r%-110s", line.c_str());
    std::fflush(stdout);
    g_barDrawn = true;
}

}  // namespace

ProgressStyle ChooseProgressStyle(bool quiet) {
    if (quiet) return ProgressStyle::Quiet;
    return isatty(STDOUT_FILENO) ? ProgressStyle::Bar : ProgressStyle::Lines;
}

void SetProgressStyle(ProgressStyle style) { g_style = style; }

bool ShowProgress(CProgressData* progress) {
    if (!progress) return true;
    switch (g_style) {
        case ProgressStyle::Quiet:
            break;
        case ProgressStyle::Bar:
            DrawBar(*progress);
            break;
        case ProgressStyle::Lines:
            if (progress->StatusTextSet && g_lastStatus != progress->StatusText) {
                g_lastStatus = progress->StatusText;
                std::printf("%s\n", progress->StatusText);
                std::fflush(stdout);
            }
            break;
    }
    return true;
}

void FinishProgress() {
    if (g_barDrawn) std::printf("\n");
    g_barDrawn = false;
}

}  // namespace pextool
