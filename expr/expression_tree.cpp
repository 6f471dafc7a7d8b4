#include "expr/expression_tree.h"

#include "diag/trace_log.h"
#include "expr/command_table.h"
#include "expr/execution_plan.h"

COverrideExpression& AddParameter(COverrideExpression& node, COverrideExpression&& parameter) {
    node.params.push_back(std::move(parameter));
    return node;
}

COverrideExpression AttachParameters(COverrideExpression&& call, COverrideExpression&& paramList) {
    // The list's DisplayText is taken before its items move into the call.
    const std::string listText = paramList.DisplayText();
    call.params = std::move(paramList.params);
    TRACE(g_TraceLog, "Evaluate Function [%s]. Params are %d:%s\n", call.DisplayText().c_str(),
          static_cast<int>(call.params.size()), listText.c_str());
    for (COverrideExpression& parameter : call.params) {
        TRACE(g_TraceLog, "[%s]\n", parameter.DisplayText().c_str());
    }
    TRACE(g_TraceLog, "Function Result: (%s)\n", ("Result:" + call.DisplayText()).c_str());
    return std::move(call);
}

COverrideExpression MakeCall(const std::string& name, COverrideExpression&& operand) {
    COverrideExpression call = COverrideExpression::FromText(COverrideExpression::kFunc, name);
    call.params.push_back(std::move(operand));
    return call;
}

COverrideExpression MakeCall(const std::string& name, COverrideExpression&& left,
                             COverrideExpression&& right) {
    COverrideExpression call = COverrideExpression::FromText(COverrideExpression::kFunc, name);
    call.params.reserve(2);
    call.params.push_back(std::move(left));
    call.params.push_back(std::move(right));
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

void MakeAssignment(const COverrideExpression& setting, COverrideExpression&& value) {
    COverrideExpression variable = CreateVariable(setting.stringValue);
    TRACE(g_TraceLog, "Assigning Setting:%s=%s\n", variable.DisplayText().c_str(),
          value.DisplayText().c_str());
    CurrentPlan().Push(MakeCall("SET", std::move(variable), std::move(value)));
}
