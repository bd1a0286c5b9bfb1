#include "base/SystemTrace.h"

#include <cstdint>
#include <string>

#include <android/trace.h>
#include <dlfcn.h>

namespace Nib
{

namespace
{

// The system's as of API level 29; looked up because the library is built for earlier levels, too.
using SetCounter = void (*)(const char* name, std::int64_t value);

/// The name with the arguments behind it: a section has nothing else.
std::string SectionName(const TraceEvent& event)
{
    std::string name = event.name;
    for (std::size_t index = 0; index < event.argumentCount; ++index)
    {
        const TraceArgument& argument = event.arguments[index];
        name += std::string(" ") + argument.key + '=';
        name += argument.text ? argument.text : std::to_string(argument.number);
    }
    return name;
}

std::string CounterName(const TraceEvent& event)
{
    std::string name = event.name;
    if (event.lane)
        name += std::string(" ") + event.lane;
    return name + " (" + std::to_string(event.thread) + ")";
}

/// ATrace's sections belong to the thread that begins and ends them. While nobody records them, no
/// name is put together; the system drops an end whose beginning came before it was recording.
class SystemTrace : public OwnedTraceSink
{
public:
    void OnTraceEvent(const TraceEvent& event) override
    {
        if (event.kind == TraceEvent::Kind::End)
            return ATrace_endSection();
        if (!ATrace_isEnabled())
            return;
        if (event.kind == TraceEvent::Kind::Counter)
            return Count(event);
        ATrace_beginSection(SectionName(event).c_str());
        if (event.kind == TraceEvent::Kind::Instant)
            ATrace_endSection();
    }

private:
    void Count(const TraceEvent& event) const
    {
        if (m_setCounter)
            m_setCounter(CounterName(event).c_str(), event.value);
    }

    const SetCounter m_setCounter =
        reinterpret_cast<SetCounter>(dlsym(RTLD_DEFAULT, "ATrace_setCounter"));
};

} // namespace

std::unique_ptr<OwnedTraceSink> NewSystemTrace()
{
    return std::make_unique<SystemTrace>();
}

} // namespace Nib
