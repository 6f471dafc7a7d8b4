// ExecutionPlan: the assignments of one row's dynamic-field text, checked and then run against
// the row. The caller makes one plan per row and calls Parse, then Validate (only after a
// successful Parse), then Execute (only after a successful Validate).
#pragma once
#include <cstdint>
#include <string>
#include <vector>

#include "expr/override_expression.h"

class UpdateServices;

class ExecutionPlan {
public:
    ExecutionPlan() = default;
    // Clears the plan; a plan that is current hands that role back to the default plan.
    virtual ~ExecutionPlan();
    ExecutionPlan(const ExecutionPlan&) = delete;
    ExecutionPlan& operator=(const ExecutionPlan&) = delete;

    // Makes this plan current and parses text into it. True when the whole text was accepted;
    // on false the grammar's message has gone to standard output and the plan is not to be
    // used (assignments before the error stay in it). Parsing twice appends.
    bool Parse(const std::string& text);
    // Appends an assignment; called by the grammar through CurrentPlan().
    void Push(COverrideExpression node);
    // Checks the items in order until the first invalid one. False with one comment per
    // problem; the caller prints the comments.
    bool Validate();
    // Runs every item against services, also after a failed one. 0 when none failed, else the
    // code of the last failure (negative), with one comment per failed item (its DisplayText).
    std::int32_t Execute(UpdateServices& services);

    const std::vector<COverrideExpression>& Items() const { return items_; }
    const std::vector<std::string>& Comments() const { return comments_; }

private:
    std::vector<COverrideExpression> items_;
    std::vector<std::string> comments_;
};

// The plan that receives the grammar's assignments: the plan being parsed, or the default plan
// when no parse has named one (or the last one named is gone).
ExecutionPlan& CurrentPlan();
ExecutionPlan& DefaultPlan();
