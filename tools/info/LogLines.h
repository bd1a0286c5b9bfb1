#ifndef NIB_TOOLS_INFO_LOG_LINES_H
#define NIB_TOOLS_INFO_LOG_LINES_H

#include <mutex>
#include <string>
#include <vector>

/// Collects the library's log lines while it lives; one at a time.
class LogLines
{
public:
    explicit LogLines(int lowestPriority);
    ~LogLines();

    LogLines(const LogLines&) = delete;
    LogLines& operator=(const LogLines&) = delete;

    std::vector<std::string> Lines() const;

private:
    static void Take(void* context, int priority, const char* message);

    mutable std::mutex m_lock;
    std::vector<std::string> m_lines;
};

#endif
