// The fault plan: counted rules that make platform operations fail or end the process.
#include "platform/fault.h"

#include <cstdlib>
#include <mutex>
#include <vector>

#include "platform/errors.h"
#include "platform/power_cut.h"

namespace plat::fault {

namespace {

struct Rule {
    Op op;
    int n;
    std::uint32_t code;
    bool persistent;
    int seen = 0;
};

struct Plan {
    std::mutex lock;
    std::vector<Rule> rules;
    int mutations = 0;
    int crashAt = 0;  // 0: no crash planned
    bool powerCut = false;
    unsigned keepSeed = 0;
    int operations[static_cast<int>(Op::Any) + 1] = {};  // by kind; Any counts every kind
};

Plan& ThePlan() {
    static Plan plan;
    return plan;
}

bool IsMutating(Op op) {
    return op == Op::Copy || op == Op::Remove || op == Op::Write || op == Op::Rename ||
           op == Op::RegWrite;
}

}  // namespace

void FailNth(Op op, int n, std::uint32_t code, bool persistent) {
    Plan& plan = ThePlan();
    std::lock_guard<std::mutex> hold(plan.lock);
    plan.rules.push_back(Rule{op, n, code, persistent});
}

void CrashAtMutation(int n) {
    Plan& plan = ThePlan();
    std::lock_guard<std::mutex> hold(plan.lock);
    plan.crashAt = n;
    plan.powerCut = false;
}

void PowerCutAtMutation(int n, unsigned keepSeed) {
    Plan& plan = ThePlan();
    std::lock_guard<std::mutex> hold(plan.lock);
    plan.crashAt = n;
    if (!plan.powerCut) power::Start();
    plan.powerCut = true;
    plan.keepSeed = keepSeed;
}

void Clear() {
    Plan& plan = ThePlan();
    std::lock_guard<std::mutex> hold(plan.lock);
    plan.rules.clear();
    plan.mutations = 0;
    plan.crashAt = 0;
    if (plan.powerCut) power::Stop();
    plan.powerCut = false;
    for (int& count : plan.operations) count = 0;
}

bool Allow(Op op) {
    Plan& plan = ThePlan();
    std::lock_guard<std::mutex> hold(plan.lock);
    if (IsMutating(op) && ++plan.mutations == plan.crashAt) {
        // No destructors, no buffered output, no clean-up of any kind.
        if (plan.powerCut) power::Cut(plan.keepSeed);
        std::_Exit(kCrashExitCode);
    }
    ++plan.operations[static_cast<int>(op)];
    ++plan.operations[static_cast<int>(Op::Any)];
    bool allowed = true;
    for (Rule& rule : plan.rules) {
        if (rule.op != op && rule.op != Op::Any) continue;
        ++rule.seen;
        // Every matching rule counts the operation, even when an earlier rule already failed it.
        if (allowed && (rule.seen == rule.n || (rule.persistent && rule.seen > rule.n))) {
            SetLastErrorCode(rule.code);
            allowed = false;
        }
    }
    return allowed;
}

int MutationCount() {
    Plan& plan = ThePlan();
    std::lock_guard<std::mutex> hold(plan.lock);
    return plan.mutations;
}

int OperationCount(Op op) {
    Plan& plan = ThePlan();
    std::lock_guard<std::mutex> hold(plan.lock);
    return plan.operations[static_cast<int>(op)];
}

}  // namespace plat::fault
