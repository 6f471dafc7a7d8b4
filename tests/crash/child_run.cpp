#include "tests/crash/child_run.h"

#include <sys/wait.h>
#include <unistd.h>

#include "platform/fault.h"

namespace pextest {

ChildRun RunInChild(const std::function<void()>& work) {
    ChildRun run;
    int fds[2];
    if (pipe(fds) != 0) {
        run.ending = "no pipe";
        return run;
    }
    const pid_t child = fork();
    if (child == 0) {
        close(fds[0]);
        work();
        const int mutations = plat::fault::MutationCount();
        const bool reported = write(fds[1], &mutations, sizeof mutations) == sizeof mutations;
        _exit(reported ? 0 : 1);  // no destructors: the parent's test objects are not ours
    }
    close(fds[1]);
    int mutations = 0;
    const bool reported = child > 0 && read(fds[0], &mutations, sizeof mutations) == sizeof mutations;
    close(fds[0]);
    int status = 0;
    if (child < 0 || waitpid(child, &status, 0) != child) {
        run.ending = "no child";
        return run;
    }
    if (WIFEXITED(status) && WEXITSTATUS(status) == plat::fault::kCrashExitCode) {
        run.crashed = true;
    } else if (WIFEXITED(status) && WEXITSTATUS(status) == 0 && reported) {
        run.finished = true;
        run.mutations = mutations;
    } else {
        run.ending = WIFSIGNALED(status) ? "signal " + std::to_string(WTERMSIG(status))
                                         : "exit " + std::to_string(WEXITSTATUS(status));
    }
    return run;
}

}  // namespace pextest
