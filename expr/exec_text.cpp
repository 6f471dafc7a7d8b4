// The text built-ins: CONCAT (also the & operator), IsUnderstood and AddPathSep.
#include "expr/command_table.h"
#include "expr/evaluation.h"
#include "expr/executors.h"

namespace {

using Node = COverrideExpression;

// The value of the single String parameter of a one-parameter text function.
Node SingleTextArgument(const std::string& op, const Node& call, UpdateServices& services) {
    if (call.params.size() != 1) ThrowFailure(op + ": Expects 1 parameters");
    if (!call.params[0].IsString()) ThrowFailure(op + ": First Parameter must be string");
    Node value = Evaluate(call.params[0], services);
    if (!value.IsString()) ThrowFailure(op + ": First Parameter Result not string");
    return value;
}

}  // namespace

COverrideExpression ExecConCat(const COverrideExpression& call, UpdateServices& services) {
    if (call.params.size() != 2) ThrowFailure("CONCAT: Expects 2 parameters");
    if (!call.params[0].IsString()) ThrowFailure("CONCAT: First Parameter must be string");
    if (!call.params[1].IsString()) ThrowFailure("CONCAT: Second Parameter must be string");
    Node first = Evaluate(call.params[0], services);
    if (!first.IsString()) ThrowFailure("CONCAT: First Result must be string");
    Node second = Evaluate(call.params[1], services);
    if (!second.IsString()) ThrowFailure("CONCAT: Second Result must be string");
    return Node::FromString(first.stringValue + second.stringValue);
}

COverrideExpression ExecIsUnderstood(const COverrideExpression& call, UpdateServices& services) {
    Node value = SingleTextArgument("ISUNDERSTOOD", call, services);
    return Node::FromBool(LookupCommand(value.stringValue) != nullptr);
}

COverrideExpression ExecAddPathSep(const COverrideExpression& call, UpdateServices& services) {
    std::string path = SingleTextArgument("AddPathSep", call, services).stringValue;
    if (!path.empty() && path.back() != '\\') path += '\\';
    return Node::FromString(path);
}
