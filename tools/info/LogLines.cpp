#include "LogLines.h"

#include <nib/log.h>

LogLines::LogLines(int lowestPriority)
{
    Nib::SetLogSink(&LogLines::Take, this, lowestPriority);
}

LogLines::~LogLines()
{
    Nib::SetLogSink(nullptr, nullptr);
}

std::vector<std::string> LogLines::Lines() const
{
    const std::lock_guard<std::mutex> guard(m_lock);
    return m_lines;
}

void LogLines::Take(void* context, int, const char* message)
{
    LogLines& self = *static_cast<LogLines*>(context);
    const std::lock_guard<std::mutex> guard(self.m_lock);
    self.m_lines.emplace_back(message);
}
