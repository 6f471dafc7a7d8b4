// Copies of a prepared emulated machine, so that every crash scenario starts from the same
// state, and snapshots of a machine's files and registry, to compare two moments.
#pragma once
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

// What a machine holds, as text: a line per file below drive_c (its host path below the root,
// read-only state, write time and the SHA-256 of its bytes) in name order, then the two hives
// as registry text. Two snapshots compare as text, so that a difference shows as a diff.
std::string SnapshotMachine();

}  // namespace pextest
