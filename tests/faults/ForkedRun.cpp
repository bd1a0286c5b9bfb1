#include "faults/ForkedRun.h"

#include <array>
#include <cerrno>
#include <chrono>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <vector>

#include <execinfo.h>
#include <fcntl.h>
#include <poll.h>
#include <sys/prctl.h>
#include <sys/syscall.h>
#include <sys/wait.h>
#include <unistd.h>

namespace
{

using Clock = std::chrono::steady_clock;
constexpr std::chrono::milliseconds kForTheThreadsToAnswer{500};
constexpr int kWhereAreYou = SIGUSR2;

/// A pipe whose two ends are closed with it.
struct Pipe
{
    std::array<int, 2> ends{-1, -1};

    Pipe()
    {
        if (pipe2(ends.data(), O_CLOEXEC) != 0)
            std::abort();
    }
    ~Pipe()
    {
        CloseEnd(0);
        CloseEnd(1);
    }
    void CloseEnd(std::size_t end)
    {
        if (ends[end] >= 0)
            close(ends[end]);
        ends[end] = -1;
    }
};

// ---- in the child -------------------------------------------------------------------------------

/// Writes name and stack of the interrupted thread to standard error, with nothing but system calls.
void TellWhere(int)
{
    char name[32] = "thread ";
    prctl(PR_GET_NAME, name + std::strlen(name));
    std::strcat(name, "\n");
    static_cast<void>(!write(STDERR_FILENO, name, std::strlen(name)));
    void* frames[32];
    backtrace_symbols_fd(frames, backtrace(frames, 32), STDERR_FILENO);
}

[[noreturn]] void BeTheChild(const std::function<std::string()>& run, Pipe& report, Pipe& messages)
{
    dup2(messages.ends[1], STDERR_FILENO);
    void* frame[1];
    backtrace(frame, 1); // loads what it needs, so that the signal handler does not
    std::signal(kWhereAreYou, &TellWhere);
    const std::string text = run();
    for (std::size_t done = 0; done < text.size();)
    {
        const ssize_t written = write(report.ends[1], text.data() + done, text.size() - done);
        if (written <= 0)
            _exit(3);
        done += static_cast<std::size_t>(written);
    }
    std::exit(0);
}

// ---- in the parent ------------------------------------------------------------------------------

void AskThreads(pid_t child)
{
    std::error_code ignored;
    const std::string tasks = "/proc/" + std::to_string(child) + "/task";
    for (const auto& task : std::filesystem::directory_iterator(tasks, ignored))
        syscall(SYS_tgkill, child, std::stoi(task.path().filename().string()), kWhereAreYou);
}

/// Takes what is there in the pipe, for @p time at most; false at its end.
bool Read(Pipe& from, std::string& text)
{
    char buffer[4096];
    const ssize_t count = read(from.ends[0], buffer, sizeof buffer);
    if (count > 0)
        text.append(buffer, static_cast<std::size_t>(count));
    if (count == 0)
        from.CloseEnd(0);
    return count > 0;
}

/// Reads both pipes until they end; false when that takes until @p limit.
bool Collect(Pipe& report, Pipe& messages, RunResult& result, Clock::time_point limit)
{
    while (report.ends[0] >= 0 || messages.ends[0] >= 0)
    {
        const auto left =
            std::chrono::duration_cast<std::chrono::milliseconds>(limit - Clock::now());
        std::array<pollfd, 2> ready{pollfd{report.ends[0], POLLIN, 0},
                                    pollfd{messages.ends[0], POLLIN, 0}};
        if (left.count() <= 0 || poll(ready.data(), ready.size(), int(left.count())) == 0)
            return false;
        if (ready[0].revents != 0)
            Read(report, result.report);
        if (ready[1].revents != 0)
            Read(messages, result.messages);
    }
    return true;
}

std::string EndOf(int status)
{
    if (WIFSIGNALED(status))
        return std::string("ended by ") + strsignal(WTERMSIG(status));
    return WEXITSTATUS(status) == 0 ? "" : "exit status " + std::to_string(WEXITSTATUS(status));
}

} // namespace

RunResult RunInChild(const std::function<std::string()>& run, std::chrono::seconds limit)
{
    Pipe report;
    Pipe messages;
    std::fflush(nullptr); // the child would write it again at its end
    const pid_t child = fork();
    if (child == 0)
        BeTheChild(run, report, messages);
    report.CloseEnd(1);
    messages.CloseEnd(1);

    RunResult result;
    if (!Collect(report, messages, result, Clock::now() + limit))
    {
        AskThreads(child);
        RunResult answers;
        Collect(report, messages, answers, Clock::now() + kForTheThreadsToAnswer);
        result.stuck = answers.messages;
        kill(child, SIGKILL);
    }
    int status = 0;
    waitpid(child, &status, 0);
    result.end = result.stuck.empty() ? EndOf(status) : "stuck";
    return result;
}
