#include "tests/support/lock_holder.h"
#ifndef _WIN32
#include <signal.h>
#include <sys/wait.h>
#include <unistd.h>

#include "platform/machine_lock.h"

namespace pextest {

ForkedLockHolder::ForkedLockHolder(const std::string& name) {
    int ready[2];
    if (pipe(ready) != 0) return;
    child_ = fork();
    if (child_ == 0) {
        plat::MachineLock lock(name);
        const char held = lock.Acquire(0) ? 'y' : 'n';
        if (write(ready[1], &held, 1) == 1) {
            for (;;) pause();  // until killed
        }
        _exit(1);  // no destructors: the parent's test objects are not the child's
    }
    close(ready[1]);
    char held = 'n';
    holding_ = child_ > 0 && read(ready[0], &held, 1) == 1 && held == 'y';
    close(ready[0]);
}

ForkedLockHolder::~ForkedLockHolder() { Kill(); }

void ForkedLockHolder::Kill() {
    if (child_ <= 0) return;
    kill(child_, SIGKILL);
    waitpid(child_, nullptr, 0);
    child_ = -1;
}

}  // namespace pextest
#endif
