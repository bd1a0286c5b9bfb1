#include "base/linux/LogWriter.h"
#include "base/LogSinkHolder.h"

#include <nib/export.h>

#include <android/log.h>

#include <cerrno>

// Alone in its file, so that a program that brings its own replaces nothing else.

extern "C" NIB_EXPORT int __android_log_print(int priority, const char* tag, const char* format,
                                              ...)
{
    Nib::LogSinkHolder& sink = Nib::LogSinkHolder::Instance();
    const bool logged = Nib::IsLogged(priority);
    const bool taken = sink.Wants(priority);
    if (!logged && !taken)
        return -EPERM;
    const int callersErrno = errno;
    std::va_list arguments;
    va_start(arguments, format);
    const std::string message = Nib::FormatLog(format, arguments);
    va_end(arguments);
    if (logged)
        Nib::WriteLog(priority, tag, message);
    if (taken)
        sink.Take(priority, message.c_str());
    errno = callersErrno;
    return logged ? 1 : -EPERM;
}
