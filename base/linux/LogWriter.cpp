#include "base/linux/LogWriter.h"

#include <android/log.h>

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <string>
#include <string_view>

#include <unistd.h>

namespace Nib
{

namespace
{

struct NamedPriority
{
    std::string_view name;
    int priority;
};

constexpr NamedPriority kPriorities[] = {
    {"verbose", ANDROID_LOG_VERBOSE}, {"debug", ANDROID_LOG_DEBUG}, {"info", ANDROID_LOG_INFO},
    {"warn", ANDROID_LOG_WARN},       {"error", ANDROID_LOG_ERROR}, {"silent", ANDROID_LOG_SILENT},
};

int ReadLowestPriority()
{
    const char* wanted = std::getenv("NIB_LOG");
    for (const NamedPriority& known : kPriorities)
    {
        if (wanted && known.name == wanted)
            return known.priority;
    }
    return ANDROID_LOG_WARN;
}

char Letter(int priority)
{
    constexpr std::string_view kLetters = "??VDIWEFS"; // by android_LogPriority
    return priority >= 0 && priority < static_cast<int>(kLetters.size()) ? kLetters[priority] : '?';
}

std::string Prefix(int priority, const char* tag)
{
    char process[16];
    std::snprintf(process, sizeof process, "(%5d): ", static_cast<int>(getpid()));
    std::string prefix{Letter(priority), '/'};
    prefix += tag ? tag : "";
    constexpr std::size_t kTagColumn = 2;
    constexpr std::size_t kTagWidth = 8;
    if (prefix.size() < kTagColumn + kTagWidth)
        prefix.resize(kTagColumn + kTagWidth, ' ');
    return prefix + process;
}

void WriteToStandardError(std::string_view text)
{
    while (!text.empty())
    {
        const ssize_t written = write(STDERR_FILENO, text.data(), text.size());
        if (written < 0 && errno == EINTR)
            continue;
        if (written <= 0)
            return; // nobody to tell
        text.remove_prefix(static_cast<std::size_t>(written));
    }
}

} // namespace

int LowestLogged()
{
    static const int lowest = ReadLowestPriority();
    return lowest;
}

bool IsLogged(int priority)
{
    return priority >= LowestLogged();
}

std::string FormatLog(const char* format, std::va_list arguments)
{
    std::va_list again;
    va_copy(again, arguments);
    const int length = std::vsnprintf(nullptr, 0, format, again);
    va_end(again);
    if (length < 0)
        return format;
    std::string message(static_cast<std::size_t>(length), '\0');
    std::vsnprintf(message.data(), message.size() + 1, format, arguments);
    return message;
}

void WriteLog(int priority, const char* tag, const std::string& message)
{
    const std::string prefix = Prefix(priority, tag);
    std::string lines = prefix;
    for (const char character : message)
    {
        lines += character;
        if (character == '\n')
            lines += prefix;
    }
    lines += '\n';
    WriteToStandardError(lines);
}

} // namespace Nib
