// The progress display over recorded sequences of the library's progress record: what UpdateAll
// and ProcessUpdateInformation send, in the order they send it.
#include <gtest/gtest.h>

#include <sstream>
#include <string>
#include <vector>

#include "tests/support/case_file.h"
#include "tools/progress_tracker.h"

namespace {

// One change the library makes to the record before calling the host.
struct Event {
    enum Kind { Status, Total, Increment } kind;
    std::string text;
    std::int32_t value;
};
Event Status(const std::string& text) { return {Event::Status, text, 0}; }
Event Total(std::int32_t value) { return {Event::Total, "", value}; }
Event Increment() { return {Event::Increment, "", 0}; }

// What the display shows after each event: "step/total product of count".
std::vector<std::string> Replay(CProgressData& record, pextool::ProgressTracker& tracker,
                                const std::vector<Event>& events) {
    std::vector<std::string> shown;
    for (const Event& event : events) {
        if (event.kind == Event::Status) record.SetStatusText(event.text);
        if (event.kind == Event::Total) record.SetTotalSteps(event.value);
        if (event.kind == Event::Increment) record.IncrementCurrentStep();
        const pextool::ProgressView view = tracker.Observe(record);
        EXPECT_LE(view.step, view.stepTotal);
        EXPECT_LE(view.product, view.productCount);
        shown.push_back(std::to_string(view.step) + "/" + std::to_string(view.stepTotal) + " " +
                        std::to_string(view.product) + " of " + std::to_string(view.productCount));
    }
    return shown;
}

// One product as ProcessUpdateInformation reports it: analysis of its rows, its total, its steps.
std::vector<Event> Product(std::int32_t rows, std::int32_t steps) {
    std::vector<Event> events{Status("Analyzing data...")};
    for (std::int32_t row = 0; row < rows; ++row) events.push_back(Status("Analyzing f" + std::to_string(row)));
    events.push_back(Total(steps));
    events.push_back(Status("Decompressing..."));
    for (std::int32_t step = 0; step < steps; ++step) {
        events.push_back(Status("Applying f" + std::to_string(step)));
        events.push_back(Increment());
    }
    events.push_back(Status("Finished."));
    return events;
}

// The events of a case's text (its file says how they are written).
std::vector<Event> Parse(const std::string& text) {
    std::vector<Event> events;
    std::istringstream in(text);
    for (std::string t; in >> t;) {
        if (t == "I") events.push_back(Increment());
        else if (t[0] == 'T') events.push_back(Total(std::stoi(t.substr(1))));
        else if (t == "A") events.push_back(Status("Analyzing data..."));
        else if (t[0] == 'A') events.push_back(Status("Analyzing " + t.substr(1)));
        else if (t == "D") events.push_back(Status("Decompressing..."));
        else if (t == "F") events.push_back(Status("Finished."));
        else if (t[0] == 'P') {
            const std::vector<Event> product = Product(std::stoi(t.substr(1)), std::stoi(t.substr(t.find('x') + 1)));
            events.insert(events.end(), product.begin(), product.end());
        } else ADD_FAILURE() << "unknown event " << t;
    }
    return events;
}

TEST(ProgressTracker, ShownOverRecordedSequences) {
    for (const pextest::Case& c : pextest::ReadCases("tools/cases/progress_tracker.txt")) {
        SCOPED_TRACE(c.where);
        CProgressData record;
        pextool::ProgressTracker tracker;
        const std::vector<Event> events = Parse(c[1]);
        const std::vector<std::string> shown = Replay(record, tracker, events);
        std::string out;
        for (std::size_t i = 0; i < events.size(); ++i)
            if (c[0] == "every" || (events[i].kind == Event::Status && events[i].text == "Finished."))
                out += (out.empty() ? "" : ", ") + shown[i];
        EXPECT_EQ(out, c[2]);
    }
}

// The record is the process's own: a second UpdateAll in the same process starts from the steps
// the first left, and a display started late sees them too.
TEST(ProgressTracker, StepsLeftByEarlierRunsInTheProcessDoNotCount) {
    CProgressData record;
    pextool::ProgressTracker first;
    const std::vector<Event> run = Parse("T2 I P1x3 I P1x2");
    Replay(record, first, run);
    EXPECT_EQ(Replay(record, first, run).back(), "2/2 2 of 2");
    pextool::ProgressTracker late;
    const std::vector<std::string> shown = Replay(record, late, run);
    EXPECT_EQ(shown[1], "0/0 1 of 2");
    EXPECT_EQ(shown.back(), "2/2 2 of 2");
}

}  // namespace
