#ifndef NIB_TOOLS_INFO_GL_REPORT_H
#define NIB_TOOLS_INFO_GL_REPORT_H

#include "DeviceReport.h"

// All of these on a render thread, with its context current.

/// Identity, extensions, limits, and what the library makes of them.
Report ReadGl();

/// What the list of GPUs without front-buffer rendering is called in ReadGpuLists.
inline constexpr const char* kNoFrontBuffer = "no front buffer";

/// The lists of GPUs that are treated apart, and which of them this GPU is in.
Report ReadGpuLists();

/// How part of a frame would be presented, and the library's own lines on the way to that.
Report ReadUpdateMode();

/// The priority that the thread's context was asked for, and what the driver granted.
Report ReadContextPriority();

#endif
