#include "expr/evaluation.h"

#include "commands/update_services.h"
#include "expr/command_table.h"

namespace {

// Keeps the nesting level equal to the real depth, also when a failure unwinds through it,
// so the indentation of later lookups in the same plan does not drift.
class NestingScope {
public:
    explicit NestingScope(UpdateServices& services) : services_(services) {
        ++services_.nestingLevel;
    }
    ~NestingScope() { --services_.nestingLevel; }
    NestingScope(const NestingScope&) = delete;
    NestingScope& operator=(const NestingScope&) = delete;

private:
    UpdateServices& services_;
};

}  // namespace

COverrideExpression Evaluate(const COverrideExpression& node, UpdateServices& services) {
    NestingScope scope(services);
    if (node.type != COverrideExpression::kFunc) return node;
    const CommandEntry* entry = LookupCommand(node.name);
    if (entry == nullptr) return COverrideExpression::Failure(COverrideExpression::kUnexpected);
    return entry->executor(node, services);
}

void ThrowFailure(const std::string& message) {
    throw COverrideExpression::Failure(COverrideExpression::kUnexpected, message);
}
