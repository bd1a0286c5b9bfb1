#ifndef NIB_LINUX_ANDROID_LOG_H
#define NIB_LINUX_ANDROID_LOG_H

// The part of Android's log interface that the library uses, provided by NibBase on Linux.

#ifdef __cplusplus
extern "C"
{
#endif

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

    int __android_log_print(int priority, const char* tag, const char* format, ...)
        __attribute__((format(printf, 3, 4)));

    void __android_log_assert(const char* condition, const char* tag, const char* format, ...)
        __attribute__((noreturn, format(printf, 3, 4)));

#ifdef __cplusplus
}
#endif

#endif
