#include "expr/execution_plan.h"

#include <exception>

#include "commands/update_services.h"
#include "diag/trace_log.h"
#include "expr/evaluation.h"
#include "expr/override_parser.h"
#include "expr/validation.h"

namespace {

ExecutionPlan* g_currentPlan = nullptr;  // nullptr stands for the default plan

}  // namespace

ExecutionPlan& DefaultPlan() {
    // Made on first use so that it exists whenever the grammar can push into it.
    static ExecutionPlan plan;
    return plan;
}

ExecutionPlan& CurrentPlan() { return g_currentPlan ? *g_currentPlan : DefaultPlan(); }

ExecutionPlan::~ExecutionPlan() {
    items_.clear();
    comments_.clear();
    if (g_currentPlan == this) g_currentPlan = nullptr;
}

bool ExecutionPlan::Parse(const std::string& text) {
    TRACE(g_TraceLog, "Parsing: %s\n", text.c_str());
    g_currentPlan = this;
    const int result = ParseOverrideText(text);
    // The bounds on a script are this system's own: the support log says which was exceeded.
    const std::string refusal = ParseRefusalMessage(result);
    if (!refusal.empty()) TRACE(g_TraceLog, "ExecutionPlan: Parse, %s\n", refusal.c_str());
    return result == kParseAccepted;
}

void ExecutionPlan::Push(COverrideExpression node) {
    TRACE(g_TraceLog, "pushing # %d, %s\n", static_cast<int>(items_.size() + 1),
          node.DisplayText().c_str());
    items_.push_back(std::move(node));
}

bool ExecutionPlan::Validate() {
    comments_.clear();
    TRACE(g_TraceLog, "Validating ExecutionPlan: Here we go....!\n");
    bool valid = true;
    for (std::size_t i = 0; i < items_.size(); ++i) {
        TRACE(g_TraceLog, "Validating Execution Item # %d.\n", static_cast<int>(i));
        if (valid) valid = ::Validate(items_[i], comments_);
        TRACE(g_TraceLog, "-- Done.\n");
    }
    TRACE(g_TraceLog, "The plan is: %s\n", valid ? "valid." : "INVALID.  Validation Comments:");
    TRACE(g_TraceLog, "That's all folks!\n");
    return valid;
}

std::int32_t ExecutionPlan::Execute(UpdateServices& services) {
    comments_.clear();
    services.nestingLevel = 0;
    TRACE(g_TraceLog, "ExecutingPlan: Here we go....!\n");
    std::int32_t code = 0;
    for (std::size_t i = 0; i < items_.size(); ++i) {
        TRACE(g_TraceLog, "Executing Item # %d.\n", static_cast<int>(i));
        try {
            Evaluate(items_[i], services);
        } catch (COverrideExpression& failure) {
            TRACE(g_TraceLog, "Plan Execution threw exception");
            code = failure.code;
            comments_.push_back(failure.DisplayText());
        } catch (const std::exception& failure) {
            // Not the language's own failure (memory ran out, a file operation failed): the
            // item fails like one, and the row's other items and the other rows go on.
            TRACE(g_TraceLog, "ExecutionPlan: Execute, item # %d failed: %s\n", static_cast<int>(i),
                  failure.what());
            code = COverrideExpression::kUnexpected;
            comments_.push_back(COverrideExpression::Failure(code, failure.what()).DisplayText());
        }
        TRACE(g_TraceLog, "-- Done.\n");
    }
    TRACE(g_TraceLog, "That's all folks!\n");
    return code;
}
