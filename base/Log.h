#ifndef NIB_BASE_LOG_H
#define NIB_BASE_LOG_H

#include <android/log.h>

#include <string_view>

namespace Nib
{

/// The tag under which every line of the library appears in the log.
inline constexpr const char* kLogTag = "nib_log";

/// Whether @p signature, a full function signature in Clang's form, names the function @p name. A
/// log line that was copied into another function without its signature is so found at build time.
constexpr bool NamesFunction(std::string_view signature, std::string_view name)
{
    const std::size_t arguments = signature.find('(');
    const std::string_view head = signature.substr(0, arguments);
    return head.size() >= name.size() && head.substr(head.size() - name.size()) == name;
}

} // namespace Nib

// Macros, because each line must reach __android_log_print with its own format and arguments: an
// application may replace that function, and the compiler checks the arguments against the format.
#define NIB_LOG_DEBUG(...) __android_log_print(ANDROID_LOG_DEBUG, Nib::kLogTag, __VA_ARGS__)
#define NIB_LOG_INFO(...) __android_log_print(ANDROID_LOG_INFO, Nib::kLogTag, __VA_ARGS__)
#define NIB_LOG_WARN(...) __android_log_print(ANDROID_LOG_WARN, Nib::kLogTag, __VA_ARGS__)
#define NIB_LOG_ERROR(...) __android_log_print(ANDROID_LOG_ERROR, Nib::kLogTag, __VA_ARGS__)

/// Ends the process with @p ... as the message, when a build-time limit of the library is exceeded.
#define NIB_ABORT(...) __android_log_assert("cond", Nib::kLogTag, __VA_ARGS__)

/// The signature that log lines of the enclosing function carry. Compilers spell
/// __PRETTY_FUNCTION__ differently, so the text is written once in each function.
#define NIB_FUNCTION(text)                                                                         \
    static constexpr const char* function = text;                                                  \
    static_assert(Nib::NamesFunction(text, __func__), "the signature names another function")

#endif
