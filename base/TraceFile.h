#ifndef NIB_BASE_TRACE_FILE_H
#define NIB_BASE_TRACE_FILE_H

#include "base/OwnedTraceSink.h"

#include <nib/base.h>

#include <cstdint>
#include <memory>
#include <mutex>
#include <string>
#include <unordered_map>

namespace Nib
{

/// A trace in Chrome's JSON format: an array with an event a line. What is written at any time is
/// that array, whole but for its closing bracket, so that a process that ends early leaves a file
/// that opens.
class TraceFile : public OwnedTraceSink
{
public:
    /// Opens @p path anew; null, with a WARN line, when that fails.
    static std::unique_ptr<TraceFile> Open(const char* path);

    void OnTraceEvent(const TraceEvent& event) override;

    /// Ends what is still open on the lanes, and the array.
    bool Close() override;

private:
    struct Lane
    {
        std::string name;
        int depth = 0; // what began on it and has not ended
    };

    explicit TraceFile(const char* path);
    void Follow(const TraceEvent& event);
    void BeginLine();
    void WriteOut();
    void GiveUp();

    const std::string m_path;
    const int m_process;
    File m_file;
    std::mutex m_lock;
    std::unordered_map<std::uint64_t, Lane> m_lanes;
    std::string m_text; // whole lines that are not written yet
    bool m_isFirstLine = true;
    bool m_failed = false;
    std::int64_t m_lastWrite = 0; // as TraceEvent::time
    std::int64_t m_lastEvent = 0;
};

} // namespace Nib

#endif
