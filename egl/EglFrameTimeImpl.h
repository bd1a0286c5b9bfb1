#ifndef NIB_EGL_EGL_FRAME_TIME_IMPL_H
#define NIB_EGL_EGL_FRAME_TIME_IMPL_H

#include <nib/egl_timing.h>

#include <EGL/egl.h>
#include <EGL/eglext.h>

namespace Nib
{

/// The frame times of EGL_ANDROID_get_frame_timestamps, bound to one surface and one frame. Made in
/// two steps, because the second one may fail.
class EglFrameTimeImpl : public EglFrameTime
{
public:
    EglFrameTimeImpl() = default;
    ~EglFrameTimeImpl() override = default;

    /// Resolves what the display has: once per process. Two threads that come first at once resolve
    /// the same pointers twice.
    static void InitOnce();

    /// Binds this to the calling thread's draw surface and its next frame.
    bool Construct();

    // The EGL names; 0, which EGL rejects, for a value behind the last one.
    static EGLint FrameTimestamp2EGLint(FrameTimestamp timestamp);
    static EGLint CompositorTiming2EGLint(CompositorTiming timing);

    bool IsTimestampSupported(FrameTimestamp timestamp) const override;
    bool IsCompositorTimingSupported(CompositorTiming timing) const override;
    EglTime GetFrameTimestamp(FrameTimestamp timestamp) const override;
    EglTime GetCompositorTiming(CompositorTiming timing) const override;
    bool SetPresentationTime(EglTime time) const override;

private:
    void DumpSupportedTimestapsOnce() const;

    static const EGLint FrameTimestampConvert[9];
    static const EGLint CompositorTimingConvert[3];

    EGLDisplay m_display = EGL_NO_DISPLAY;
    EGLSurface m_surface = EGL_NO_SURFACE;
    EGLuint64KHR m_frameId = 0;
};

} // namespace Nib

#endif
