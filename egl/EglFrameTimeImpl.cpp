#include "egl/EglFrameTimeImpl.h"

#include <nib/egl.h>

#include "base/Log.h"
#include "egl/EglTokens.h"
#include "egl/EntryPoint.h"

#include <iterator>
#include <memory>

namespace Nib
{

namespace
{

EntryPoint<PFNEGLGETCOMPOSITORTIMINGSUPPORTEDANDROIDPROC>
    g_compositorTimingSupported("eglGetCompositorTimingSupportedANDROID");
EntryPoint<PFNEGLGETCOMPOSITORTIMINGANDROIDPROC>
    g_getCompositorTiming("eglGetCompositorTimingANDROID");
EntryPoint<PFNEGLGETFRAMETIMESTAMPSUPPORTEDANDROIDPROC>
    g_frameTimestampSupported("eglGetFrameTimestampSupportedANDROID");
EntryPoint<PFNEGLGETNEXTFRAMEIDANDROIDPROC> g_getNextFrameId("eglGetNextFrameIdANDROID");
EntryPoint<PFNEGLGETFRAMETIMESTAMPSANDROIDPROC>
    g_getFrameTimestamps("eglGetFrameTimestampsANDROID");
EntryPoint<PFNEGLPRESENTATIONTIMEANDROIDPROC> g_presentationTime("eglPresentationTimeANDROID");
std::atomic<bool> g_initialised{false};
std::atomic<bool> g_timestampsDumped{false};

// What the log says once about each time.
struct SupportLine
{
    EGLint name;
    const char* format;
};

constexpr SupportLine kCompositorTimingLines[] = {
    {EGL_COMPOSITE_DEADLINE_ANDROID, "EGL_COMPOSITE_DEADLINE_ANDROID - %s"},
    {EGL_COMPOSITE_INTERVAL_ANDROID, "EGL_COMPOSITE_INTERVAL_ANDROID - %s"},
    {EGL_COMPOSITE_TO_PRESENT_LATENCY_ANDROID, "EGL_COMPOSITE_TO_PRESENT_LATENCY_ANDROID - %s"},
};

constexpr SupportLine kFrameTimestampLines[] = {
    {EGL_REQUESTED_PRESENT_TIME_ANDROID, "EGL_REQUESTED_PRESENT_TIME_ANDROID - %s"},
    {EGL_RENDERING_COMPLETE_TIME_ANDROID, "EGL_RENDERING_COMPLETE_TIME_ANDROID - %s"},
    {EGL_COMPOSITION_LATCH_TIME_ANDROID, "EGL_COMPOSITION_LATCH_TIME_ANDROID - %s"},
    {EGL_FIRST_COMPOSITION_START_TIME_ANDROID, "EGL_FIRST_COMPOSITION_START_TIME_ANDROID - %s"},
    {EGL_LAST_COMPOSITION_START_TIME_ANDROID, "EGL_LAST_COMPOSITION_START_TIME_ANDROID - %s"},
    {EGL_FIRST_COMPOSITION_GPU_FINISHED_TIME_ANDROID,
     "EGL_FIRST_COMPOSITION_GPU_FINISHED_TIME_ANDROID - %s"},
    {EGL_DISPLAY_PRESENT_TIME_ANDROID, "EGL_DISPLAY_PRESENT_TIME_ANDROID - %s"},
    {EGL_DEQUEUE_READY_TIME_ANDROID, "EGL_DEQUEUE_READY_TIME_ANDROID - %s"},
    {EGL_READS_DONE_TIME_ANDROID, "EGL_READS_DONE_TIME_ANDROID - %s"},
};

const char* Text(bool value)
{
    return value ? "true" : "false";
}

} // namespace

const EGLint EglFrameTimeImpl::FrameTimestampConvert[9] = {
    EGL_REQUESTED_PRESENT_TIME_ANDROID,              // 0
    EGL_RENDERING_COMPLETE_TIME_ANDROID,             // 1
    EGL_COMPOSITION_LATCH_TIME_ANDROID,              // 2
    EGL_FIRST_COMPOSITION_START_TIME_ANDROID,        // 3
    EGL_LAST_COMPOSITION_START_TIME_ANDROID,         // 4
    EGL_FIRST_COMPOSITION_GPU_FINISHED_TIME_ANDROID, // 5
    EGL_DISPLAY_PRESENT_TIME_ANDROID,                // 6
    EGL_DEQUEUE_READY_TIME_ANDROID,                  // 7
    EGL_READS_DONE_TIME_ANDROID,                     // 8
};

const EGLint EglFrameTimeImpl::CompositorTimingConvert[3] = {
    EGL_COMPOSITE_DEADLINE_ANDROID,           // 0
    EGL_COMPOSITE_INTERVAL_ANDROID,           // 1
    EGL_COMPOSITE_TO_PRESENT_LATENCY_ANDROID, // 2
};

EGLint EglFrameTimeImpl::FrameTimestamp2EGLint(FrameTimestamp timestamp)
{
    const auto index = static_cast<unsigned>(timestamp);
    return index < std::size(FrameTimestampConvert) ? FrameTimestampConvert[index] : 0;
}

EGLint EglFrameTimeImpl::CompositorTiming2EGLint(CompositorTiming timing)
{
    const auto index = static_cast<unsigned>(timing);
    return index < std::size(CompositorTimingConvert) ? CompositorTimingConvert[index] : 0;
}

// ---- what the display has -----------------------------------------------------------------------

EglFrameTime::~EglFrameTime() = default;

void EglFrameTimeImpl::InitOnce()
{
    NIB_FUNCTION("static void Nib::EglFrameTimeImpl::InitOnce()");
    static constexpr const char* kTimestamps = "ANDROID_get_frame_timestamps";
    // Acquire pairs with the release below: who sees the flag sees the entry points.
    if (g_initialised.load(std::memory_order_acquire))
        return;
    const Egl* egl = Egl::GetInstance();
    if (egl->IsEglExtensionSupported(kTimestamps))
    {
        NIB_LOG_INFO("%s extension %s is supported", function, kTimestamps);
        g_compositorTimingSupported.Resolve(function);
        g_getCompositorTiming.Resolve(function);
        g_frameTimestampSupported.Resolve(function);
        g_getNextFrameId.Resolve(function);
        g_getFrameTimestamps.Resolve(function);
    }
    if (egl->IsEglExtensionSupported("ANDROID_presentation_time"))
        g_presentationTime.Resolve(function);
    g_initialised.store(true, std::memory_order_release);
}

bool EglFrameTime::IsFrameTimestampSupported()
{
    EglFrameTimeImpl::InitOnce();
    return g_getNextFrameId.Get() != nullptr;
}

bool IsPresentationTimeSupported()
{
    EglFrameTimeImpl::InitOnce();
    return g_presentationTime.Get() != nullptr;
}

// ---- the object of one frame --------------------------------------------------------------------

EglFrameTime* EglFrameTime::GetForNextFrame()
{
    NIB_FUNCTION("static Nib::EglFrameTime *Nib::EglFrameTime::GetForNextFrame()");
    EglFrameTimeImpl::InitOnce();
    if (g_getNextFrameId.Get() == nullptr)
        return nullptr;
    auto frameTime = std::make_unique<EglFrameTimeImpl>();
    if (frameTime->Construct())
        return frameTime.release();
    NIB_LOG_ERROR("%s Failed to initialize EglFrameTime", function);
    return nullptr;
}

bool EglFrameTimeImpl::Construct()
{
    NIB_FUNCTION("bool Nib::EglFrameTimeImpl::Construct()");
    m_display = Egl::GetInstance()->GetDisplay();
    m_surface = eglGetCurrentSurface(EGL_DRAW);
    DumpSupportedTimestapsOnce();
    if (eglSurfaceAttrib(m_display, m_surface, EGL_TIMESTAMPS_ANDROID, EGL_TRUE) != EGL_TRUE)
    {
        NIB_LOG_ERROR("%s: eglSurfaceAttrib(%p, %p, EGL_TIMESTAMPS_ANDROID, true). Error:%d",
                      function, m_display, m_surface, eglGetError());
        return false;
    }
    if (g_getNextFrameId.Get()(m_display, m_surface, &m_frameId) != EGL_TRUE)
    {
        NIB_LOG_ERROR("%s: eglGetNextFrameIdANDROID. Error:%d", function, eglGetError());
        return false;
    }
    return true;
}

void EglFrameTimeImpl::DumpSupportedTimestapsOnce() const
{
    if (g_timestampsDumped.exchange(true, std::memory_order_relaxed))
        return;
    if (const auto supported = g_compositorTimingSupported.Get())
    {
        for (const auto& [name, format] : kCompositorTimingLines)
            NIB_LOG_INFO(format, Text(supported(m_display, m_surface, name) == EGL_TRUE));
    }
    if (const auto supported = g_frameTimestampSupported.Get())
    {
        for (const auto& [name, format] : kFrameTimestampLines)
            NIB_LOG_INFO(format, Text(supported(m_display, m_surface, name) == EGL_TRUE));
    }
}

bool EglFrameTimeImpl::IsTimestampSupported(FrameTimestamp timestamp) const
{
    const auto supported = g_frameTimestampSupported.Get();
    return supported != nullptr &&
           supported(m_display, m_surface, FrameTimestamp2EGLint(timestamp)) == EGL_TRUE;
}

bool EglFrameTimeImpl::IsCompositorTimingSupported(CompositorTiming timing) const
{
    // The other function of the pair is the one that tells whether the display has both.
    if (g_frameTimestampSupported.Get() == nullptr)
        return false;
    const auto supported = g_compositorTimingSupported.Get();
    return supported != nullptr &&
           supported(m_display, m_surface, CompositorTiming2EGLint(timing)) == EGL_TRUE;
}

EglTime EglFrameTimeImpl::GetFrameTimestamp(FrameTimestamp timestamp) const
{
    NIB_FUNCTION("virtual Nib::EglTime Nib::EglFrameTimeImpl::GetFrameTimestamp("
                 "Nib::EglFrameTime::FrameTimestamp) const");
    const EGLint name = FrameTimestamp2EGLint(timestamp);
    EGLnsecsANDROID value = 0;
    const auto get = g_getFrameTimestamps.Get();
    if (get == nullptr || get(m_display, m_surface, m_frameId, 1, &name, &value) == EGL_FALSE)
    {
        NIB_LOG_ERROR("%s: eglGetFrameTimestampsANDROID. Error:%x", function,
                      static_cast<unsigned>(eglGetError()));
    }
    return value;
}

EglTime EglFrameTimeImpl::GetCompositorTiming(CompositorTiming timing) const
{
    NIB_FUNCTION("virtual Nib::EglTime Nib::EglFrameTimeImpl::GetCompositorTiming("
                 "Nib::EglFrameTime::CompositorTiming) const");
    const EGLint name = CompositorTiming2EGLint(timing);
    EGLnsecsANDROID value = 0;
    const auto get = g_getCompositorTiming.Get();
    if (get == nullptr || get(m_display, m_surface, 1, &name, &value) == EGL_FALSE)
    {
        NIB_LOG_ERROR("%s: eglGetCompositorTimingANDROID. Error:%x", function,
                      static_cast<unsigned>(eglGetError()));
    }
    return value;
}

bool EglFrameTimeImpl::SetPresentationTime(EglTime time) const
{
    NIB_FUNCTION("virtual bool Nib::EglFrameTimeImpl::SetPresentationTime(Nib::EglTime) const");
    const auto set = g_presentationTime.Get();
    if (set == nullptr)
        return false;
    if (set(m_display, m_surface, time) == EGL_TRUE)
        return true;
    NIB_LOG_ERROR("%s: eglPresentationTimeANDROID. Error:%x", function,
                  static_cast<unsigned>(eglGetError()));
    return false;
}

} // namespace Nib
