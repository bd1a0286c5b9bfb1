#include "base/TraceFile.h"

#include "base/Log.h"
#include "base/TraceText.h"

#include <cerrno>
#include <cstring>

#include <sys/prctl.h>
#include <sys/stat.h>
#include <unistd.h>

namespace Nib
{

namespace
{

// Written out when there is so much, or when it is so old: little is lost with a process that ends
// early, and a thread seldom waits for the disk.
constexpr std::size_t kWholeBuffer = 32 * 1024;
constexpr std::int64_t kLongestDelay = 50'000'000; // ns

/// Makes room for a new file. An older trace may still be writing to the one of that name.
/// @return false for what writing to would end the process once the other side has gone
bool MakeRoom(const char* path)
{
    struct stat status;
    if (stat(path, &status) != 0)
        return true;
    if (S_ISREG(status.st_mode))
        unlink(path);
    return !S_ISFIFO(status.st_mode) && !S_ISSOCK(status.st_mode);
}

/// What the system calls the calling thread.
std::string NameOfCallingThread()
{
    char name[17] = {};
    prctl(PR_GET_NAME, name);
    return name;
}

void WarnOfOpening(const char* path, const char* reason)
{
    NIB_LOG_WARN("Trace: cannot write to '%s': %s. Nothing is traced.", path, reason);
}

} // namespace

std::unique_ptr<TraceFile> TraceFile::Open(const char* path)
{
    std::unique_ptr<TraceFile> trace(new TraceFile(path));
    const String name(path);
    if (!MakeRoom(path))
    {
        WarnOfOpening(path, "it is a pipe");
        return nullptr;
    }
    if (!trace->m_file.Construct(&name, "w", false))
    {
        WarnOfOpening(path, std::strerror(errno));
        return nullptr;
    }
    return trace;
}

TraceFile::TraceFile(const char* path) : m_path(path), m_process(getpid()), m_text("[") {}

void TraceFile::OnTraceEvent(const TraceEvent& event)
{
    const std::lock_guard lock(m_lock);
    if (m_failed)
        return;
    if (event.kind != TraceEvent::Kind::Counter) // which tells its lane in its name
        Follow(event);
    BeginLine();
    AppendTraceEvent(m_text, event, m_process);
    m_lastEvent = event.time;
    if (m_text.size() >= kWholeBuffer || event.time - m_lastWrite >= kLongestDelay)
        WriteOut();
}

/// Keeps account of the calling thread's lane; its name is written when it is new.
void TraceFile::Follow(const TraceEvent& event)
{
    const auto [place, isNew] = m_lanes.try_emplace(event.thread);
    Lane& lane = place->second;
    if (event.lane ? lane.name != event.lane : isNew)
    {
        lane.name = event.lane ? event.lane : NameOfCallingThread();
        BeginLine();
        AppendLaneName(m_text, event.thread, lane.name, m_process);
    }
    if (event.kind == TraceEvent::Kind::Begin)
        ++lane.depth;
    if (event.kind == TraceEvent::Kind::End)
        --lane.depth;
}

/// The comma stands before what follows it: what is written ends with a whole event.
void TraceFile::BeginLine()
{
    m_text += m_isFirstLine ? "\n" : ",\n";
    m_isFirstLine = false;
}

void TraceFile::WriteOut()
{
    m_lastWrite = m_lastEvent;
    if (m_file.Write(m_text.data(), 1, m_text.size()) != m_text.size())
        GiveUp();
    m_text.clear();
}

void TraceFile::GiveUp()
{
    m_failed = true;
    NIB_LOG_WARN("Trace: cannot write to '%s': %s. It ends there; drawing goes on.", m_path.c_str(),
                 std::strerror(errno));
}

bool TraceFile::Close()
{
    const std::lock_guard lock(m_lock);
    for (auto& [thread, lane] : m_lanes)
    {
        for (; lane.depth > 0; --lane.depth)
        {
            BeginLine();
            AppendTraceEvent(m_text,
                             {TraceEvent::Kind::End, thread, nullptr, m_lastEvent, nullptr, nullptr,
                              0, nullptr, 0},
                             m_process);
        }
    }
    m_text += "\n]\n";
    if (!m_failed)
        WriteOut();
    if (m_file.Close() != 0 && !m_failed)
        GiveUp();
    return !m_failed;
}

} // namespace Nib
