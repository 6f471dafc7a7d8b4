// The progress display over recorded sequences of the library's progress record: what UpdateAll
// and ProcessUpdateInformation send, in the order they send it.
#include <gtest/gtest.h>

#include <sstream>
#include <string>
#include <vector>

#include "tests/support/case_file.h"
#include "tools/progress_tracker.h"

namespace {

// Makes one change of a case's text to the record, as the library does before calling the host.
void Change(CProgressData& record, const std::string& event) {
    if (event == "I") record.IncrementCurrentStep();
    else if (event[0] == 'T') record.SetTotalSteps(std::stoi(event.substr(1)));
    else if (event == "A") record.SetStatusText("Analyzing data...");
    else if (event[0] == 'A') record.SetStatusText("Analyzing " + event.substr(1));
    else if (event[0] == 'X') record.SetStatusText("Applying " + event.substr(1));
    else if (event == "D") record.SetStatusText("Decompressing...");
    else if (event == "F") record.SetStatusText("Finished.");
    else ADD_FAILURE() << "unknown event " << event;
}

// What the display shows after each event: "step/total product of count".
std::vector<std::string> Replay(CProgressData& record, pextool::ProgressTracker& tracker,
                                const std::vector<std::string>& events) {
    std::vector<std::string> shown;
    for (const std::string& event : events) {
        Change(record, event);
        const pextool::ProgressView view = tracker.Observe(record);
        EXPECT_LE(view.step, view.stepTotal);
        EXPECT_LE(view.product, view.productCount);
        shown.push_back(std::to_string(view.step) + "/" + std::to_string(view.stepTotal) + " " +
                        std::to_string(view.product) + " of " + std::to_string(view.productCount));
    }
    return shown;
}

// The events of a case's text, each product (PrxS) written out as ProcessUpdateInformation
// reports it: analysis of its rows, its total, then each step applied.
std::vector<std::string> Parse(const std::string& text) {
    std::vector<std::string> events;
    std::istringstream in(text);
    for (std::string event; in >> event;) {
        if (event[0] != 'P') {
            events.push_back(event);
            continue;
        }
        std::string product = "A";
        for (int row = 0; row < std::stoi(event.substr(1)); ++row) product += " Af" + std::to_string(row);
        const std::string steps = event.substr(event.find('x') + 1);
        product += " T" + steps + " D";
        for (int step = 0; step < std::stoi(steps); ++step) product += " Xf" + std::to_string(step) + " I";
        const std::vector<std::string> expanded = Parse(product + " F");
        events.insert(events.end(), expanded.begin(), expanded.end());
    }
    return events;
}

TEST(ProgressTracker, ShownOverRecordedSequences) {
    for (const pextest::Case& c : pextest::ReadCases("tools/cases/progress_tracker.txt")) {
        SCOPED_TRACE(c.where);
        CProgressData record;
        pextool::ProgressTracker tracker, late;
        const std::vector<std::string> events = Parse(c[1]);
        if (c[0] == "again" || c[0] == "late") Replay(record, tracker, events);  // a run before, in the process
        const std::vector<std::string> shown = Replay(record, c[0] == "late" ? late : tracker, events);
        std::string out;
        for (std::size_t i = 0; i < events.size(); ++i)
            if (c[0] == "every" || c[0] == "late" || events[i] == "F")
                out += (out.empty() ? "" : ", ") + shown[i];
        EXPECT_EQ(out, c[2]);
    }
}

// A long status text is cut to the record's 255 characters.
TEST(ProgressTracker, StatusTextIsCutTo255Characters) {
    CProgressData progress;
    EXPECT_FALSE(progress.StatusTextSet);
    progress.SetStatusText(std::string(300, 'x'));
    EXPECT_EQ(std::string(progress.StatusText), std::string(255, 'x'));
    EXPECT_TRUE(progress.StatusTextSet);
}

}  // namespace
