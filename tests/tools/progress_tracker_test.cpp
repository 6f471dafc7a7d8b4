// The progress display over recorded sequences of the library's progress record: what UpdateAll
// and ProcessUpdateInformation send, in the order they send it.
#include <gtest/gtest.h>

#include <string>
#include <vector>

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

std::vector<Event> Join(std::vector<std::vector<Event>> parts) {
    std::vector<Event> all;
    for (auto& part : parts) all.insert(all.end(), part.begin(), part.end());
    return all;
}

TEST(ProgressTracker, EachProductCountsItsOwnStepsAgainstItsOwnTotal) {
    struct Case {
        const char* name;
        std::vector<Event> events;
        std::vector<std::string> lastShownOfEachProduct;  // after its "Finished."
    } cases[] = {
        {"two products of two steps", Join({{Total(2), Increment()}, Product(1, 2), {Increment()}, Product(2, 2)}),
         {"2/2 1 of 2", "2/2 2 of 2"}},
        {"a product total equal to the product count",
         Join({{Total(3), Increment()}, Product(1, 3), {Increment()}, Product(1, 1), {Increment()}, Product(0, 3)}),
         {"3/3 1 of 3", "1/1 2 of 3", "3/3 3 of 3"}},
        {"a product without a content file", Join({{Total(2), Increment(), Status("Analyzing data..."),
                                                    Status("Finished."), Increment()},
                                                   Product(1, 4)}),
         {"0/0 1 of 2", "4/4 2 of 2"}},
        {"a product run on its own", Product(2, 3), {"3/3 0 of 0"}},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(c.name);
        CProgressData record;
        pextool::ProgressTracker tracker;
        const std::vector<std::string> shown = Replay(record, tracker, c.events);
        std::vector<std::string> finished;
        for (std::size_t i = 0; i < c.events.size(); ++i)
            if (c.events[i].kind == Event::Status && c.events[i].text == "Finished.") finished.push_back(shown[i]);
        EXPECT_EQ(finished, c.lastShownOfEachProduct);
    }
}

TEST(ProgressTracker, AProductsTotalIsUnknownUntilItsAnalysisEnds) {
    CProgressData record;
    pextool::ProgressTracker tracker;
    const std::vector<std::string> shown = Replay(
        record, tracker, {Total(2), Increment(), Status("Analyzing data..."), Status("Analyzing a"), Total(5),
                          Status("Decompressing..."), Increment()});
    EXPECT_EQ(shown, (std::vector<std::string>{"0/0 0 of 2", "0/0 1 of 2", "0/0 1 of 2", "0/0 1 of 2", "0/5 1 of 2",
                                               "0/5 1 of 2", "1/5 1 of 2"}));
}

// The record is the process's own: a second UpdateAll in the same process starts from the steps
// the first left, and a display started late sees them too.
TEST(ProgressTracker, StepsLeftByEarlierRunsInTheProcessDoNotCount) {
    CProgressData record;
    pextool::ProgressTracker first;
    const std::vector<Event> run = Join({{Total(2), Increment()}, Product(1, 3), {Increment()}, Product(1, 2)});
    Replay(record, first, run);
    EXPECT_EQ(Replay(record, first, run).back(), "2/2 2 of 2");
    pextool::ProgressTracker late;
    const std::vector<std::string> shown = Replay(record, late, run);
    EXPECT_EQ(shown[1], "0/0 1 of 2");
    EXPECT_EQ(shown.back(), "2/2 2 of 2");
}

}  // namespace
