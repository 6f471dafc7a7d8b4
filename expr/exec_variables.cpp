// The assignment SET and the variable reader GetVar: the two executors that reach the row.
#include <algorithm>

#include "commands/update_services.h"
#include "diag/trace_log.h"
#include "expr/command_table.h"
#include "expr/evaluation.h"
#include "expr/executors.h"

using Node = COverrideExpression;

COverrideExpression SET(const COverrideExpression& call, UpdateServices& services) {
    if (call.params.size() != 2) ThrowFailure("SET: Expects 2 parameters");
    const Node& target = call.params[0];
    if (!target.IsSettable()) ThrowFailure("SET: First Parameter not a settable object");
    if (call.params[1].ResultType() != target.ResultType()) ThrowFailure("SET: Type mismatch.");
    Node value = Evaluate(call.params[1], services);
    // The row keeps whatever the services could store; the assignment itself has succeeded.
    services.SetSymbol(target.name, value);
    return Node::Failure(0);
}

COverrideExpression GetVar(const COverrideExpression& call, UpdateServices& services) {
    std::string indent(3 * static_cast<std::size_t>(std::max(services.nestingLevel, 0)), ' ');
    const CommandEntry* entry = LookupCommand(call.name);
    if (entry == nullptr) {
        TRACE(g_TraceLog, "%sError finding Variable [%s]: Unknown Name!\n", indent.c_str(),
              call.name.c_str());
        ThrowFailure("GetVar: Unknown Name");
    }
    TRACE(g_TraceLog, "%sLooking up Variable [%s] of type %s\n", indent.c_str(), call.name.c_str(),
          Node::TypeName(entry->resultType));
    Node value = services.GetSymbol(call.name);
    if (value.type != entry->resultType) ThrowFailure("GetVar: Type Mismatch");
    return value;
}
