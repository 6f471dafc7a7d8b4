// The conditional selectors IIFS, IIFB and IIFN: only the chosen branch is evaluated.
#include "expr/evaluation.h"
#include "expr/executors.h"

namespace {

using Node = COverrideExpression;

Node Select(const char* op, std::int32_t wanted, const Node& call, UpdateServices& services) {
    const std::string name = op;
    if (call.params.size() != 3) ThrowFailure(name + ": Expects 3 parameters");
    const Node& condition = call.params[0];
    if (!condition.IsBool()) {
        ThrowFailure(name + ": First Parameter [" + condition.name + "] must be BOOL");
    }
    Node decided = Evaluate(condition, services);
    if (!decided.IsBool()) {
        ThrowFailure(name + ": First Parameter result [" + decided.name + "] was not BOOL");
    }
    Node chosen = Evaluate(call.params[decided.boolValue ? 1 : 2], services);
    if (chosen.type == wanted) return chosen;
    ThrowFailure(name + ": " + (decided.boolValue ? "Second" : "Third") + " Parameter result [" +
                 chosen.name + "] was not correct type" + Node::TypeName(wanted));
}

}  // namespace

COverrideExpression ExecIIFS(const COverrideExpression& call, UpdateServices& services) {
    return Select("IIFS", Node::kString, call, services);
}

COverrideExpression ExecIIFB(const COverrideExpression& call, UpdateServices& services) {
    return Select("IIFB", Node::kBool, call, services);
}

COverrideExpression ExecIIFN(const COverrideExpression& call, UpdateServices& services) {
    return Select("IIFN", Node::kNumber, call, services);
}
