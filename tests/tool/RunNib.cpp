#include "RunNib.h"

#include <algorithm>
#include <csignal>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <stdexcept>
#include <sys/wait.h>
#include <unistd.h>

RunningNib::RunningNib(const std::vector<std::string>& arguments,
                       const std::map<std::string, std::string>& environment)
{
    m_errFile = std::filesystem::temp_directory_path() / "nib-err-XXXXXX";
    const int err = mkstemp(m_errFile.data());
    int out[2];
    if (err < 0 || pipe(out) != 0)
        throw std::runtime_error("no pipe or file for the tool's output");

    std::vector<char*> words;
    std::string program = NIB_TOOL;
    words.push_back(program.data());
    for (const std::string& argument : arguments)
        words.push_back(const_cast<char*>(argument.c_str()));
    words.push_back(nullptr);

    m_process = fork();
    if (m_process == 0)
    {
        for (const auto& [name, value] : environment)
            value.empty() ? unsetenv(name.c_str()) : setenv(name.c_str(), value.c_str(), 1);
        dup2(out[1], STDOUT_FILENO);
        dup2(err, STDERR_FILENO);
        close(out[0]);
        close(out[1]);
        execv(NIB_TOOL, words.data());
        _exit(127);
    }
    close(out[1]);
    close(err);
    m_out = out[0];
}

RunningNib::~RunningNib()
{
    if (m_process > 0)
    {
        kill(m_process, SIGKILL);
        waitpid(m_process, nullptr, 0);
    }
    if (m_out >= 0)
        close(m_out);
    unlink(m_errFile.c_str());
}

std::string RunningNib::ReadLine()
{
    std::string line;
    for (char next = 0; read(m_out, &next, 1) == 1 && next != '\n';)
        line += next;
    return line;
}

void RunningNib::Stop() const
{
    kill(m_process, SIGSTOP);
    waitpid(m_process, nullptr, WUNTRACED);
}

void RunningNib::Continue() const
{
    kill(m_process, SIGCONT);
}

NibResult RunningNib::Finish()
{
    NibResult result;
    char buffer[4096];
    for (ssize_t count; (count = read(m_out, buffer, sizeof buffer)) > 0;)
        result.out.append(buffer, static_cast<std::size_t>(count));
    int status = 0;
    waitpid(m_process, &status, 0);
    m_process = -1;
    result.status = WIFEXITED(status) ? WEXITSTATUS(status) : 128 + WTERMSIG(status);
    std::ifstream err(m_errFile);
    result.err.assign(std::istreambuf_iterator<char>(err), {});
    return result;
}

NibResult RunNib(const std::vector<std::string>& arguments,
                 const std::map<std::string, std::string>& environment)
{
    return RunningNib(arguments, environment).Finish();
}

TemporaryFolder::TemporaryFolder()
{
    m_path = std::filesystem::temp_directory_path() / "nib-test-XXXXXX";
    if (!mkdtemp(m_path.data()))
        throw std::runtime_error("no temporary folder");
}

TemporaryFolder::~TemporaryFolder()
{
    std::error_code ignored;
    std::filesystem::remove_all(m_path, ignored);
}

std::string TemporaryFolder::Write(const std::string& name, const std::string& text) const
{
    std::ofstream(Path(name), std::ios::binary) << text;
    return Path(name);
}

std::vector<std::string> TemporaryFolder::Files() const
{
    std::vector<std::string> names;
    for (const auto& entry : std::filesystem::directory_iterator(m_path))
        names.push_back(entry.path().filename());
    std::sort(names.begin(), names.end());
    return names;
}

std::string FurtherRecording(const std::string& name)
{
    const char* const folder = std::getenv("NIB_STROKES");
    return folder ? std::string(folder) + "/" + name : std::string();
}
