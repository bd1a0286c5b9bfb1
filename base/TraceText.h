#ifndef NIB_BASE_TRACE_TEXT_H
#define NIB_BASE_TRACE_TEXT_H

#include <nib/trace.h>

#include <string>

namespace Nib
{

/// Adds @p event to @p out as an object of Chrome's trace format, for the process @p process.
void AppendTraceEvent(std::string& out, const TraceEvent& event, int process);

/// Adds the object that names the lane of @p thread.
void AppendLaneName(std::string& out, std::uint64_t thread, const std::string& name, int process);

} // namespace Nib

#endif
