#include <nib/trace.h>

#include "base/Log.h"
#include "base/SystemTrace.h"
#include "base/TraceFile.h"
#include "base/TraceSinkHolder.h"

#include <nib/base.h>

#include <chrono>
#include <cstdlib>
#include <utility>

namespace Nib
{

std::atomic<unsigned> Trace::s_listeners{0};

namespace
{

thread_local const char* t_lane = nullptr;
thread_local const std::uint64_t t_thread = GetNibCurrentThreadId();

std::int64_t Now()
{
    const auto time = std::chrono::steady_clock::now().time_since_epoch();
    return std::chrono::duration_cast<std::chrono::nanoseconds>(time).count();
}

} // namespace

ITraceSink::~ITraceSink() = default;

// ---- the switch ---------------------------------------------------------------------------------

void Trace::SetSink(ITraceSink* sink)
{
    TraceSinkHolder::Instance().Set(sink);
}

bool Trace::StartFile(const char* path)
{
    std::unique_ptr<TraceFile> file = TraceFile::Open(path);
    if (!file)
        return false;
    TraceSinkHolder::Instance().Set(std::move(file));
    return true;
}

bool Trace::StartSystem()
{
    std::unique_ptr<OwnedTraceSink> sink = NewSystemTrace();
    if (!sink)
    {
        NIB_LOG_WARN("Trace: this system has no trace of its own. Nothing is traced.");
        return false;
    }
    TraceSinkHolder::Instance().Set(std::move(sink));
    return true;
}

bool Trace::Stop()
{
    return TraceSinkHolder::Instance().Set(static_cast<ITraceSink*>(nullptr));
}

void Trace::StartFromEnvironment()
{
    if (!TraceSinkHolder::Instance().IsUntouched())
        return;
    const char* path = std::getenv("NIB_TRACE");
    if (path && *path)
        StartFile(path);
}

void Trace::SetListening(unsigned listener, bool isListening)
{
    if (isListening)
        s_listeners.fetch_or(listener, std::memory_order_relaxed);
    else
        s_listeners.fetch_and(~listener, std::memory_order_relaxed);
}

// ---- the events ---------------------------------------------------------------------------------

void Trace::Write(TraceEvent::Kind kind, const char* category, const char* name,
                  std::initializer_list<TraceArgument> arguments)
{
    TraceSinkHolder::Instance().Take(
        {kind, t_thread, t_lane, Now(), category, name, 0, arguments.begin(), arguments.size()});
}

void Trace::WriteCounter(const char* category, const char* name, std::int64_t value,
                         std::uint64_t thread, const char* lane)
{
    const bool isOwn = thread == 0;
    TraceSinkHolder::Instance().Take({TraceEvent::Kind::Counter, isOwn ? t_thread : thread,
                                      isOwn ? t_lane : lane, Now(), category, name, value, nullptr,
                                      0});
}

const char* Trace::ExchangeLane(const char* name)
{
    return std::exchange(t_lane, name);
}

} // namespace Nib
