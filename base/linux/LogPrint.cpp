#include "base/linux/LogSink.h"

#include <nib/export.h>

#include <android/log.h>

#include <cerrno>

// Alone in its file, so that a program that brings its own replaces nothing else.

extern "C" NIB_EXPORT int __android_log_print(int priority, const char* tag, const char* format,
                                              ...)
{
    if (!Nib::IsLogged(priority))
        return -EPERM;
    std::va_list arguments;
    va_start(arguments, format);
    Nib::WriteLog(priority, tag, format, arguments);
    va_end(arguments);
    return 1;
}
