// The fault plan: the one seam through which tests make platform operations fail or end the
// process mid-run. Nothing outside the tests sets it; with no plan set every check passes.
#pragma once
#include <cstdint>
#include <functional>

namespace plat::fault {

enum class Op { Copy, Remove, Write, Rename, RegWrite, ProcessStart, Any };

// The nth (1-based) operation of the kind (Any: of every kind), counted from when the rule is
// set, fails with the code; with persistent, that operation and every later one of the kind
// fails.
void FailNth(Op op, int n, std::uint32_t code, bool persistent = false);

// The process ends (_exit, no clean-up, as a power cut would) just before its nth mutating
// operation (copy, delete, write, rename, attribute or time change, registry write), counted
// since the last Clear. The exit status is kCrashExitCode.
void CrashAtMutation(int n);
constexpr int kCrashExitCode = 86;

// As CrashAtMutation, and the power goes with the process: before it ends, the machine's drive C
// is replaced by what would survive a power cut (platform/power_cut.h says what was made
// durable). keepSeed 0 keeps nothing that was not made durable; another seed keeps a random
// subset of those changes, the same subset for the same seed. Everything on drive C counts as
// durable when the first such rule since the last Clear is set; a later one only moves the cut.
void PowerCutAtMutation(int n, unsigned keepSeed = 0);

// Removes every rule and resets the counters.
void Clear();

// Called by the platform before an operation: counts it, ends the process if a crash rule
// says so, and returns false with the last error set when the operation must fail.
bool Allow(Op op);

// Mutating operations counted since the last Clear (for the crash-point tests).
int MutationCount();

// Operations of the kind (Any: of every kind) checked since the last Clear, whether or not a
// rule failed them, so that a test can make each of them fail in turn.
int OperationCount(Op op);

}  // namespace plat::fault
