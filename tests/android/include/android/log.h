#ifndef NIB_TESTS_ANDROID_LOG_H
#define NIB_TESTS_ANDROID_LOG_H

// Declarations only: what the library uses of the platform's log, for checking that its
// Android-only files compile.

extern "C"
{
    typedef enum android_LogPriority
    {
        ANDROID_LOG_UNKNOWN = 0,
        ANDROID_LOG_DEFAULT,
        ANDROID_LOG_VERBOSE,
        ANDROID_LOG_DEBUG,
        ANDROID_LOG_INFO,
        ANDROID_LOG_WARN,
        ANDROID_LOG_ERROR,
        ANDROID_LOG_FATAL,
        ANDROID_LOG_SILENT
    } android_LogPriority;

    int __android_log_print(int prio, const char* tag, const char* fmt, ...)
        __attribute__((__format__(printf, 3, 4)));
    void __android_log_assert(const char* cond, const char* tag, const char* fmt, ...)
        __attribute__((__noreturn__)) __attribute__((__format__(printf, 3, 4)));
}

#endif
