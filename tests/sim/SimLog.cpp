#include "SimDriver.h"
#include "SimState.h"

#include <algorithm>
#include <cstdarg>
#include <cstdio>
#include <cstdlib>
#include <mutex>

namespace
{

/// The captured log has a lock of its own: lines are written inside and outside of driver calls.
struct LogStore
{
    std::mutex mutex;
    std::vector<SimLogLine> lines;
    bool print = false;
};

LogStore& Store()
{
    static LogStore* const store = new LogStore;
    return *store;
}

__attribute__((format(printf, 1, 0))) std::string Format(const char* format, va_list args)
{
    va_list again;
    va_copy(again, args);
    const int length = std::vsnprintf(nullptr, 0, format, again);
    va_end(again);
    std::string text(static_cast<std::size_t>(std::max(length, 0)) + 1, '\0');
    std::vsnprintf(text.data(), text.size(), format, args);
    text.pop_back();
    return text;
}

void Append(int priority, const char* tag, const std::string& text)
{
    const unsigned thread = Sim::ThreadNumber();
    LogStore& store = Store();
    const std::lock_guard lock(store.mutex);
    store.lines.push_back({priority, tag ? tag : "", text, thread});
    if (store.print)
        std::fprintf(stderr, "[%d] %s: %s\n", priority, tag ? tag : "", text.c_str());
}

} // namespace

extern "C" __attribute__((visibility("default"))) int
__android_log_print(int priority, const char* tag, const char* format, ...)
{
    va_list args;
    va_start(args, format);
    const std::string text = Format(format, args);
    va_end(args);
    Append(priority, tag, text);
    return static_cast<int>(text.size());
}

extern "C" __attribute__((visibility("default"))) void
__android_log_assert(const char* condition, const char* tag, const char* format, ...)
{
    std::string text = std::string("Assertion failed: ") + (condition ? condition : "");
    if (format)
    {
        va_list args;
        va_start(args, format);
        text = Format(format, args);
        va_end(args);
    }
    Append(ANDROID_LOG_FATAL, tag, text);
    // What a death test looks for: "tag: condition: message".
    std::fprintf(stderr, "%s: %s: %s\n", tag ? tag : "", condition ? condition : "", text.c_str());
    std::fflush(stderr);
    std::abort();
}

std::vector<SimLogLine> SimDriver::Log() const
{
    LogStore& store = Store();
    const std::lock_guard lock(store.mutex);
    return store.lines;
}

std::vector<std::string> SimDriver::LogTexts(int priority) const
{
    std::vector<std::string> texts;
    for (const SimLogLine& line : Log())
    {
        if (line.priority == priority)
            texts.push_back(line.text);
    }
    return texts;
}

bool SimDriver::HasLog(int priority, const std::string& text) const
{
    return CountLog(priority, text) != 0;
}

std::size_t SimDriver::CountLog(int priority, const std::string& text) const
{
    const std::vector<std::string> texts = LogTexts(priority);
    return static_cast<std::size_t>(std::count(texts.begin(), texts.end(), text));
}

std::size_t SimDriver::CountLogContaining(const std::string& part) const
{
    const std::vector<SimLogLine> lines = Log();
    const auto contains = [&](const SimLogLine& line)
    { return line.text.find(part) != std::string::npos; };
    return static_cast<std::size_t>(std::count_if(lines.begin(), lines.end(), contains));
}

void SimDriver::ForgetLog()
{
    LogStore& store = Store();
    const std::lock_guard lock(store.mutex);
    store.lines.clear();
}

void SimDriver::PrintLog(bool on)
{
    LogStore& store = Store();
    const std::lock_guard lock(store.mutex);
    store.print = on;
}
