#include "SimEgl.h"

#include <algorithm>

// Frame timestamps, compositor timing and presentation times.

namespace Sim
{

namespace
{

constexpr EGLint kFrameTimes[] = {
    EGL_REQUESTED_PRESENT_TIME_ANDROID,
    EGL_RENDERING_COMPLETE_TIME_ANDROID,
    EGL_COMPOSITION_LATCH_TIME_ANDROID,
    EGL_FIRST_COMPOSITION_START_TIME_ANDROID,
    EGL_LAST_COMPOSITION_START_TIME_ANDROID,
    EGL_FIRST_COMPOSITION_GPU_FINISHED_TIME_ANDROID,
    EGL_DISPLAY_PRESENT_TIME_ANDROID,
    EGL_DEQUEUE_READY_TIME_ANDROID,
    EGL_READS_DONE_TIME_ANDROID,
};

constexpr EGLint kCompositorTimes[] = {
    EGL_COMPOSITE_DEADLINE_ANDROID,
    EGL_COMPOSITE_INTERVAL_ANDROID,
    EGL_COMPOSITE_TO_PRESENT_LATENCY_ANDROID,
};

/// As many frames as the system remembers.
constexpr EGLuint64KHR kFrameHistory = 8;

template <std::size_t N>
bool Supports(const State& state, const EGLint (&names)[N], EGLint name)
{
    return std::find(std::begin(names), std::end(names), name) != std::end(names) &&
           !state.refusedTimings.count(name);
}

/// The window surface; null, with the error set, when it is none.
Surface* CheckWindow(EglEntry& entry, EGLDisplay display, EGLSurface handle)
{
    if (!entry || !entry.Check(display))
        return nullptr;
    Surface* const surface = entry.CheckSurface(handle);
    if (surface && !surface->window)
    {
        entry.Refuse(EGL_BAD_SURFACE);
        return nullptr;
    }
    return surface;
}

EGLnsecsANDROID TimeOf(const std::map<EGLint, EGLnsecsANDROID>& times, EGLint name)
{
    const auto found = times.find(name);
    return found == times.end() ? EGL_TIMESTAMP_PENDING_ANDROID : found->second;
}

} // namespace

namespace Extension
{

EGLBoolean eglGetCompositorTimingSupportedANDROID(EGLDisplay display, EGLSurface surface,
                                                  EGLint name)
{
    EglEntry entry("eglGetCompositorTimingSupportedANDROID", {display, surface, name});
    return CheckWindow(entry, display, surface) && Supports(entry.state, kCompositorTimes, name);
}

EGLBoolean eglGetCompositorTimingANDROID(EGLDisplay display, EGLSurface surface, EGLint count,
                                         const EGLint* names, EGLnsecsANDROID* values)
{
    EglEntry entry("eglGetCompositorTimingANDROID",
                   {display, surface, count, (const void*)names, (const void*)values});
    entry.List(names, count);
    const Surface* const window = CheckWindow(entry, display, surface);
    if (!window)
        return EGL_FALSE;
    if (!window->timestamps)
        return entry.Refuse(EGL_BAD_SURFACE);
    for (EGLint i = 0; i < count; ++i)
    {
        if (!Supports(entry.state, kCompositorTimes, names[i]))
            return entry.Refuse(EGL_BAD_PARAMETER);
    }
    for (EGLint i = 0; i < count; ++i)
        values[i] = TimeOf(entry.state.compositorTimes, names[i]);
    return EGL_TRUE;
}

EGLBoolean eglGetFrameTimestampSupportedANDROID(EGLDisplay display, EGLSurface surface, EGLint name)
{
    EglEntry entry("eglGetFrameTimestampSupportedANDROID", {display, surface, name});
    return CheckWindow(entry, display, surface) && Supports(entry.state, kFrameTimes, name);
}

EGLBoolean eglGetNextFrameIdANDROID(EGLDisplay display, EGLSurface surface, EGLuint64KHR* id)
{
    EglEntry entry("eglGetNextFrameIdANDROID", {display, surface, (const void*)id});
    const Surface* const window = CheckWindow(entry, display, surface);
    if (!window)
        return EGL_FALSE;
    if (!window->timestamps)
        return entry.Refuse(EGL_BAD_SURFACE);
    *id = window->nextFrameId;
    return EGL_TRUE;
}

EGLBoolean eglGetFrameTimestampsANDROID(EGLDisplay display, EGLSurface surface, EGLuint64KHR id,
                                        EGLint count, const EGLint* names, EGLnsecsANDROID* values)
{
    EglEntry entry("eglGetFrameTimestampsANDROID",
                   {display, surface, id, count, (const void*)names, (const void*)values});
    entry.List(names, count);
    const Surface* const window = CheckWindow(entry, display, surface);
    if (!window)
        return EGL_FALSE;
    if (!window->timestamps)
        return entry.Refuse(EGL_BAD_SURFACE);
    for (EGLint i = 0; i < count; ++i)
    {
        if (!Supports(entry.state, kFrameTimes, names[i]))
            return entry.Refuse(EGL_BAD_PARAMETER);
    }
    if (id > window->nextFrameId || id + kFrameHistory < window->nextFrameId)
        return entry.Refuse(EGL_BAD_ACCESS);
    const bool presented = id < window->nextFrameId;
    for (EGLint i = 0; i < count; ++i)
        values[i] =
            presented ? TimeOf(entry.state.frameTimes, names[i]) : EGL_TIMESTAMP_PENDING_ANDROID;
    return EGL_TRUE;
}

EGLBoolean eglPresentationTimeANDROID(EGLDisplay display, EGLSurface surface, EGLnsecsANDROID time)
{
    EglEntry entry("eglPresentationTimeANDROID", {display, surface, time});
    Surface* const window = CheckWindow(entry, display, surface);
    if (!window)
        return EGL_FALSE;
    window->presentationTimes.push_back(time);
    return EGL_TRUE;
}

} // namespace Extension

} // namespace Sim

void SimDriver::SetFrameTime(EGLint name, EGLnsecsANDROID value)
{
    const std::lock_guard lock(Sim::GetState().mutex);
    Sim::GetState().frameTimes[name] = value;
}

void SimDriver::SetCompositorTime(EGLint name, EGLnsecsANDROID value)
{
    const std::lock_guard lock(Sim::GetState().mutex);
    Sim::GetState().compositorTimes[name] = value;
}

void SimDriver::RefuseTiming(EGLint name)
{
    const std::lock_guard lock(Sim::GetState().mutex);
    Sim::GetState().refusedTimings.insert(name);
}
