// The Boolean operators. AND and OR stop after the first operand when it decides the result;
// XOR and NOT always evaluate all their operands.
#include "expr/evaluation.h"
#include "expr/executors.h"

namespace {

using Node = COverrideExpression;

// AND (decider false) and OR (decider true): the second operand is neither checked nor
// evaluated once the first equals the decider.
Node ShortCircuit(const char* op, bool decider, const Node& call, UpdateServices& services) {
    const std::string name = op;
    if (call.params.size() != 2) ThrowFailure(name + ": Expects 2 parameters");
    const Node& first = call.params[0];
    const Node& second = call.params[1];
    if (!first.IsBool()) ThrowFailure(name + ": First Parameter [" + first.name + "]must be BOOL");
    if (Evaluate(first, services).boolValue == decider) return Node::FromBool(decider);
    if (!second.IsBool()) {
        ThrowFailure(name + ": Second Parameter [" + second.name + "] must be BOOL");
    }
    return Node::FromBool(Evaluate(second, services).boolValue);
}

}  // namespace

COverrideExpression ExecAND(const COverrideExpression& call, UpdateServices& services) {
    return ShortCircuit("AND", false, call, services);
}

COverrideExpression ExecOR(const COverrideExpression& call, UpdateServices& services) {
    return ShortCircuit("OR", true, call, services);
}

COverrideExpression ExecXOR(const COverrideExpression& call, UpdateServices& services) {
    if (call.params.size() != 2) ThrowFailure("XOR: Expects 2 parameters");
    if (!call.params[0].IsBool()) ThrowFailure("XOR: First Parameter must be BOOL");
    if (!call.params[1].IsBool()) ThrowFailure("XOR: Second Parameter must be BOOL");
    Node first = Evaluate(call.params[0], services);
    if (!first.IsBool()) ThrowFailure("XOR: First Parameter must be BOOL");
    Node second = Evaluate(call.params[1], services);
    if (!second.IsBool()) ThrowFailure("XOR: Second Parameter must be BOOL");
    return Node::FromBool(first.boolValue != second.boolValue);
}

COverrideExpression ExecNOT(const COverrideExpression& call, UpdateServices& services) {
    if (call.params.size() != 1) ThrowFailure("NOT: Expects 1 parameter");
    if (!call.params[0].IsBool()) ThrowFailure("NOT: First Parameter must be BOOL");
    Node value = Evaluate(call.params[0], services);
    if (!value.IsBool()) ThrowFailure("NOT: First Parameter must be BOOL");
    return Node::FromBool(!value.boolValue);
}
