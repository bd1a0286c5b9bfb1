#include "base/linux/LogWriter.h"

#include <nib/export.h>

#include <android/log.h>

#include <cstdlib>

// Alone in its file, so that a program that brings its own replaces nothing else.

extern "C" NIB_EXPORT void __android_log_assert(const char*, const char* tag, const char* format,
                                                ...)
{
    if (!format)
        format = "Assertion failed";
    if (Nib::IsLogged(ANDROID_LOG_FATAL))
    {
        std::va_list arguments;
        va_start(arguments, format);
        Nib::WriteLog(ANDROID_LOG_FATAL, tag, Nib::FormatLog(format, arguments));
        va_end(arguments);
    }
    std::abort();
}
