// Another process on the same emulated machine that holds a machine lock until it is killed:
// for the tests of one run per machine (processes need fork, so not on Windows).
#pragma once
#ifndef _WIN32
#include <sys/types.h>

#include <string>

namespace pextest {

class ForkedLockHolder {
public:
    // Forks a child that takes the lock of that name and keeps it; returns once it holds it
    // (Holding false when it could not take it).
    explicit ForkedLockHolder(const std::string& name);
    ~ForkedLockHolder();  // kills the child when it is still there
    ForkedLockHolder(const ForkedLockHolder&) = delete;
    ForkedLockHolder& operator=(const ForkedLockHolder&) = delete;

    bool Holding() const { return holding_; }
    // Ends the child with SIGKILL, as a crash would, and waits for it.
    void Kill();

private:
    pid_t child_ = -1;
    bool holding_ = false;
};

}  // namespace pextest
#endif
