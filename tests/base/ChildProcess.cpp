#include "base/ChildProcess.h"

#include <gtest/gtest.h>

#include <cstdio>
#include <cstdlib>
#include <filesystem>

#include <fcntl.h>
#include <sys/wait.h>
#include <unistd.h>

std::string ChildResult::Text() const
{
    std::string text;
    for (const std::string& part : writes)
        text += part;
    return text;
}

ChildResult RunInChild(const std::function<void()>& action)
{
    // A pipe of packets: one read gives what one write put in.
    int ends[2];
    EXPECT_EQ(pipe2(ends, O_DIRECT | O_CLOEXEC), 0);

    ChildResult result;
    std::fflush(nullptr); // what is still in a buffer would be written twice
    result.pid = fork();
    if (result.pid == 0)
    {
        dup2(ends[1], STDERR_FILENO);
        close(ends[0]);
        close(ends[1]);
        action();
        std::fflush(nullptr);
        _exit(testing::Test::HasFailure() ? 1 : 0);
    }
    close(ends[1]);
    char packet[4096];
    for (ssize_t length = 0; (length = read(ends[0], packet, sizeof packet)) > 0;)
        result.writes.emplace_back(packet, static_cast<std::size_t>(length));
    close(ends[0]);

    int status = 0;
    EXPECT_EQ(waitpid(result.pid, &status, 0), result.pid);
    if (WIFEXITED(status))
        result.exitCode = WEXITSTATUS(status);
    if (WIFSIGNALED(status))
        result.signal = WTERMSIG(status);
    return result;
}

Variable::Variable(const char* name, const char* value) : m_name(name)
{
    const char* before = std::getenv(name);
    m_wasSet = before != nullptr;
    m_before = before ? before : "";
    value ? setenv(name, value, 1) : unsetenv(name);
}

Variable::~Variable()
{
    m_wasSet ? setenv(m_name, m_before.c_str(), 1) : unsetenv(m_name);
}

TemporaryFolder::TemporaryFolder()
{
    std::string path = std::filesystem::temp_directory_path() / "nib-test-XXXXXX";
    EXPECT_NE(mkdtemp(path.data()), nullptr);
    m_path = path;
}

TemporaryFolder::~TemporaryFolder()
{
    std::error_code ignored;
    std::filesystem::remove_all(m_path, ignored);
}

bool IsFolder(const std::string& path)
{
    return std::filesystem::is_directory(path);
}
