#ifndef NIB_TESTS_BASE_CHILD_PROCESS_H
#define NIB_TESTS_BASE_CHILD_PROCESS_H

#include <functional>
#include <string>
#include <vector>

#include <sys/types.h>

/// How a child process went: what is read from the environment once needs a process of its own.
struct ChildResult
{
    pid_t pid = 0;
    int exitCode = -1;               ///< of an ordinary end
    int signal = 0;                  ///< that ended it
    std::vector<std::string> writes; ///< what each write to standard error held

    std::string Text() const;
};

/// Runs @p action in a child that ends with 0 behind it, or with 1 when an expectation failed.
ChildResult RunInChild(const std::function<void()>& action);

/// The environment of this process, as it was before, when the object ends.
class Variable
{
public:
    Variable(const char* name, const char* value); ///< null unsets it

    Variable(const Variable&) = delete;
    Variable& operator=(const Variable&) = delete;
    ~Variable();

private:
    const char* m_name;
    bool m_wasSet;
    std::string m_before;
};

/// A folder that goes, with what is in it, when the object ends.
class TemporaryFolder
{
public:
    TemporaryFolder();
    ~TemporaryFolder();
    TemporaryFolder(const TemporaryFolder&) = delete;
    TemporaryFolder& operator=(const TemporaryFolder&) = delete;

    const std::string& Path() const { return m_path; }
    std::string operator/(const std::string& name) const { return m_path + "/" + name; }

private:
    std::string m_path;
};

bool IsFolder(const std::string& path);

#endif
