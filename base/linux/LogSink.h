#ifndef NIB_BASE_LINUX_LOG_SINK_H
#define NIB_BASE_LINUX_LOG_SINK_H

#include <cstdarg>

namespace Nib
{

/// Whether the user wants to see lines of @p priority: those from NIB_LOG on, which is read once.
bool IsLogged(int priority);

/// Formats one message and writes it to standard error in logcat's brief form, with one system
/// call, so that messages of several threads do not mix. A message of several lines has the prefix
/// before each.
void WriteLog(int priority, const char* tag, const char* format, std::va_list arguments)
    __attribute__((format(printf, 3, 0)));

} // namespace Nib

#endif
