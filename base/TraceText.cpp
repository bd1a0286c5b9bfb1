#include "base/TraceText.h"

#include <cstdio>
#include <cstring>
#include <string_view>

namespace Nib
{

namespace
{

constexpr std::size_t kNotUtf8 = 0;

/// The bytes of the character at the beginning of @p text, kNotUtf8 where there is none.
std::size_t CharacterLength(std::string_view text)
{
    const auto byte = [&](std::size_t index) { return static_cast<unsigned char>(text[index]); };
    const unsigned char first = byte(0);
    const std::size_t length = first < 0x80   ? 1
                               : first < 0xC2 ? 0
                               : first < 0xE0 ? 2
                               : first < 0xF0 ? 3
                               : first < 0xF5 ? 4
                                              : 0;
    if (length > text.size())
        return kNotUtf8;
    for (std::size_t index = 1; index < length; ++index)
    {
        if ((byte(index) & 0xC0) != 0x80)
            return kNotUtf8;
    }
    // Longer than need be, a half of a surrogate pair, or beyond the last character.
    const bool isOutside =
        length > 2 && ((first == 0xE0 && byte(1) < 0xA0) || (first == 0xED && byte(1) >= 0xA0) ||
                       (first == 0xF0 && byte(1) < 0x90) || (first == 0xF4 && byte(1) >= 0x90));
    return isOutside ? kNotUtf8 : length;
}

void AppendCharacter(std::string& out, std::string_view character)
{
    const char first = character[0];
    if (first == '"' || first == '\\')
        out += '\\';
    if (static_cast<unsigned char>(first) >= 0x20)
    {
        out += character;
        return;
    }
    char escape[8];
    std::snprintf(escape, sizeof escape, "\\u%04x", static_cast<unsigned>(first));
    out += escape;
}

/// @p text in quotes; what is not UTF-8 becomes question marks.
void AppendText(std::string& out, std::string_view text)
{
    out += '"';
    while (!text.empty())
    {
        const std::size_t length = CharacterLength(text);
        if (length == kNotUtf8)
            out += '?';
        else
            AppendCharacter(out, text.substr(0, length));
        text.remove_prefix(length == kNotUtf8 ? 1 : length);
    }
    out += '"';
}

void AppendArgument(std::string& out, const TraceArgument& argument)
{
    AppendText(out, argument.key);
    out += ':';
    if (argument.text)
        AppendText(out, argument.text);
    else
        out += std::to_string(argument.number);
}

void AppendArguments(std::string& out, const TraceEvent& event)
{
    out += R"(,"args":{)";
    for (std::size_t index = 0; index < event.argumentCount; ++index)
    {
        if (index > 0)
            out += ',';
        AppendArgument(out, event.arguments[index]);
    }
    out += '}';
}

/// Microseconds, to the nanosecond.
void AppendTime(std::string& out, std::int64_t nanoseconds)
{
    char text[32];
    std::snprintf(text, sizeof text, "%lld.%03d", static_cast<long long>(nanoseconds / 1000),
                  static_cast<int>(nanoseconds % 1000));
    out += R"(,"ts":)";
    out += text;
}

void AppendHead(std::string& out, const char* phase, std::uint64_t thread, int process)
{
    out += R"({"ph":")";
    out += phase;
    out += R"(","pid":)" + std::to_string(process) + R"(,"tid":)" + std::to_string(thread);
}

const char* Phase(TraceEvent::Kind kind)
{
    switch (kind)
    {
    case TraceEvent::Kind::Begin: return "B";
    case TraceEvent::Kind::End: return "E";
    case TraceEvent::Kind::Counter: return "C";
    case TraceEvent::Kind::Instant: break;
    }
    return "i";
}

/// Counters belong to the process, so that the name tells the lane.
void AppendCounter(std::string& out, const TraceEvent& event)
{
    std::string name = event.name;
    if (event.lane)
        name += std::string(" ") + event.lane;
    AppendText(out, name + " (" + std::to_string(event.thread) + ")");
    out += R"(,"args":{"value":)" + std::to_string(event.value) + '}';
}

} // namespace

void AppendTraceEvent(std::string& out, const TraceEvent& event, int process)
{
    AppendHead(out, Phase(event.kind), event.thread, process);
    AppendTime(out, event.time);
    if (event.kind != TraceEvent::Kind::End)
    {
        out += R"(,"cat":)";
        AppendText(out, event.category);
        out += R"(,"name":)";
        if (event.kind == TraceEvent::Kind::Counter)
            AppendCounter(out, event);
        else
            AppendText(out, event.name);
    }
    if (event.kind == TraceEvent::Kind::Instant)
        out += R"(,"s":"t")";
    if (event.argumentCount > 0)
        AppendArguments(out, event);
    out += '}';
}

void AppendLaneName(std::string& out, std::uint64_t thread, const std::string& name, int process)
{
    AppendHead(out, "M", thread, process);
    out += R"(,"name":"thread_name","args":{"name":)";
    AppendText(out, name);
    out += "}}";
}

} // namespace Nib
