#include "base/linux/LogThreshold.h"
#include "base/linux/LogWriter.h"
#include "base/LogSinkHolder.h"

#include <nib/export.h>

#include <android/log.h>

#include <cerrno>

// Alone in its file, so that a program that brings its own replaces nothing else.

namespace
{

// A line that somebody may want. Apart, so that one that nobody wants pays for nothing here.
[[gnu::noinline]] int Print(int priority, const char* tag, const char* format,
                            std::va_list arguments)
{
    const int callersErrno = errno;
    if (Nib::IsDroppedByNow(priority))
        return -EPERM;
    const bool logged = Nib::IsLogged(priority);
    const std::string message = Nib::FormatLog(format, arguments);
    if (logged)
        Nib::WriteLog(priority, tag, message);
    Nib::LogSinkHolder& sink = Nib::LogSinkHolder::Instance();
    if (sink.Wants(priority))
        sink.Take(priority, message.c_str());
    errno = callersErrno;
    return logged ? 1 : -EPERM;
}

} // namespace

extern "C" NIB_EXPORT int __android_log_print(int priority, const char* tag, const char* format,
                                              ...)
{
    if (Nib::IsDropped(priority)) [[likely]]
        return -EPERM;
    std::va_list arguments;
    va_start(arguments, format);
    const int result = Print(priority, tag, format, arguments);
    va_end(arguments);
    return result;
}
