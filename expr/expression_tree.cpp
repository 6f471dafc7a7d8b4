#include "expr/expression_tree.h"

#include "diag/trace_log.h"
#include "expr/command_table.h"
#include "expr/execution_plan.h"

COverrideExpression AddParameter(COverrideExpression& node, const COverrideExpression& parameter) {
    node.params.push_back(parameter);
    return node;
}

COverrideExpression AttachParameters(COverrideExpression& call, COverrideExpression& paramList) {
    call.params = paramList.params;
    TRACE(g_TraceLog, "Evaluate Function [%s]. Params are %d:%s\n", call.DisplayText().c_str(),
          static_cast<int>(call.params.size()), paramList.DisplayText().c_str());
    for (COverrideExpression& parameter : call.params) {
        TRACE(g_TraceLog, "[%s]\n", parameter.DisplayText().c_str());
    }
    TRACE(g_TraceLog, "Function Result: (%s)\n", ("Result:" + call.DisplayText()).c_str());
    return call;
}

COverrideExpression MakeCall(const std::string& name, const COverrideExpression& operand) {
    COverrideExpression call = COverrideExpression::FromText(COverrideExpression::kFunc, name);
    call.params.push_back(operand);
    return call;
}

COverrideExpression MakeCall(const std::string& name, const COverrideExpression& left,
                             const COverrideExpression& right) {
    COverrideExpression call = COverrideExpression::FromText(COverrideExpression::kFunc, name);
    call.params.push_back(left);
    call.params.push_back(right);
    return call;
}

COverrideExpression CreateVariable(const std::string& text) {
    if (LookupCommand(text) == nullptr) {
        TRACE(g_TraceLog, "Error creating Variable [%s]: Unknown Name!\n", text.c_str());
        return COverrideExpression::Failure(COverrideExpression::kUnexpected);
    }
    COverrideExpression variable = COverrideExpression::FromText(COverrideExpression::kFunc, text);
    TRACE(g_TraceLog, "Creating Variable [%s] of type %s\n", text.c_str(),
          COverrideExpression::TypeName(variable.type));
    return variable;
}

COverrideExpression MakeAssignment(const COverrideExpression& setting, COverrideExpression& value) {
    COverrideExpression variable = CreateVariable(setting.stringValue);
    TRACE(g_TraceLog, "Assigning Setting:%s=%s\n", variable.DisplayText().c_str(),
          value.DisplayText().c_str());
    COverrideExpression assignment = MakeCall("SET", variable, value);
    CurrentPlan().Push(assignment);
    return assignment;
}
