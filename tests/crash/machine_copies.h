// Copies of a prepared emulated machine, so that every crash scenario starts from the same
// state, and snapshots of a machine's files and registry, to compare two moments.
#pragma once
#include <map>
#include <string>

namespace pextest {

// A copy of the machine root at fromRoot, the platform pointed at it; removed when it goes out
// of scope, whichever way the test leaves. The copies live in memory (/dev/shm) when the host
// has it: the runs flush every file and registry change to the disk, which memory does at no
// cost. The registry of the current root is closed first, so that its file is complete when it
// is copied.
class MachineCopy {
public:
    explicit MachineCopy(const std::string& fromRoot);
    ~MachineCopy();
    MachineCopy(const MachineCopy&) = delete;
    MachineCopy& operator=(const MachineCopy&) = delete;
    const std::string& Root() const { return root_; }

private:
    std::string root_;
};

// What a machine holds: every file below drive_c (bytes, read-only state, write time) and the
// two hives as registry text. Keys are "file:<host path below the root>" and "reg:<hive>".
using MachineSnapshot = std::map<std::string, std::string>;
MachineSnapshot SnapshotMachine();

// The keys whose entries differ, for a readable failure message.
std::string SnapshotDifference(const MachineSnapshot& before, const MachineSnapshot& after);

}  // namespace pextest
