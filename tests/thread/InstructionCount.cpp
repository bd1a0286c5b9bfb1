#include "thread/InstructionCount.h"

#include <csignal>

#include <sys/ptrace.h>
#include <sys/wait.h>
#include <unistd.h>

namespace
{

/// Waits until the process stops; false when it has ended.
bool WaitForStop(pid_t process, int* signal)
{
    int status = 0;
    if (waitpid(process, &status, 0) != process || !WIFSTOPPED(status))
        return false;
    *signal = WSTOPSIG(status);
    return true;
}

void End(pid_t process)
{
    kill(process, SIGKILL);
    int status = 0;
    waitpid(process, &status, 0);
}

/// Steps until the process stops itself, and counts the steps.
long StepUntil(pid_t process, int end)
{
    for (long steps = 0;; ++steps)
    {
        int signal = 0;
        if (ptrace(PTRACE_SINGLESTEP, process, nullptr, nullptr) != 0 ||
            !WaitForStop(process, &signal))
            return -1;
        if (signal == end)
            return steps;
    }
}

} // namespace

long InstructionsOf(const std::function<void()>& action)
{
    const pid_t copy = fork();
    if (copy == 0)
    {
        if (ptrace(PTRACE_TRACEME, 0, nullptr, nullptr) != 0)
            _exit(1);
        raise(SIGSTOP);
        action();
        raise(SIGUSR1);
        _exit(0);
    }
    int signal = 0;
    long steps = -1;
    if (WaitForStop(copy, &signal))
    {
        steps = StepUntil(copy, SIGUSR1);
        End(copy);
    }
    return steps;
}

bool IsInstrumented()
{
#if defined(__SANITIZE_ADDRESS__) || defined(__SANITIZE_THREAD__)
    return true;
#elif defined(__has_feature)
#if __has_feature(address_sanitizer) || __has_feature(thread_sanitizer)
    return true;
#endif
#endif
    return false;
}
