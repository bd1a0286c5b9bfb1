#ifndef NIB_BASE_LINUX_LOG_WRITER_H
#define NIB_BASE_LINUX_LOG_WRITER_H

#include <cstdarg>
#include <string>

namespace Nib
{

/// The lowest priority of lines that the user wants to see: NIB_LOG, which is read once.
int LowestLogged();

/// Whether the user wants to see lines of @p priority.
bool IsLogged(int priority);

/// The message as it goes out.
std::string FormatLog(const char* format, std::va_list arguments)
    __attribute__((format(printf, 1, 0)));

/// Writes one message to standard error in logcat's brief form, with one system call, so that
/// messages of several threads do not mix. A message of several lines has the prefix before each.
void WriteLog(int priority, const char* tag, const std::string& message);

} // namespace Nib

#endif
