#ifndef NIB_EGL_TIMING_H
#define NIB_EGL_TIMING_H

/// @file
/// Fences in the GL command stream, and the times at which frames reach the display.

#include <nib/export.h>

#include <cstdint>

namespace Nib
{

/// A fence in the GL command stream (EGL_KHR_fence_sync).
///
/// Owner    the caller, who deletes it.
/// Threads  made on a thread with a current context; waited for, asked and deleted on any thread.
/// Failure  reported by results, with a log line. Nothing throws.
class NIB_EXPORT EglSyncObject
{
public:
    /// How a wait ended.
    enum class WaitResult : int
    {
        Passed = 0,   ///< the GPU has passed the fence
        TimedOut = 1, ///< the time was up first
        Failed = 2,   ///< EGL refused, or there is no fence
    };

    /// Where a fence stands.
    enum class ObjectState : int
    {
        Unknown = -1,    ///< EGL refused, or there is no fence
        NotSignaled = 0, ///< the GPU has not passed the fence
        Signaled = 1,    ///< the GPU has passed the fence
    };

    /// Inserts a fence behind the commands issued so far on the calling thread's context.
    /// @return the fence, owned by the caller; null when the display has no fences or EGL refuses
    static EglSyncObject* CreateEglSyncObject();

    virtual ~EglSyncObject();

    /// Flushes, then waits [blocks] until the GPU has passed the fence.
    virtual WaitResult Wait() const = 0;

    /// Flushes, then waits [blocks] for @p timeoutNs nanoseconds at most.
    virtual WaitResult WaitTimeout(std::uint64_t timeoutNs) const = 0;

    /// Whether the GPU has passed the fence; does not wait.
    virtual ObjectState GetState() const = 0;
};

/// A time as EGL reports it, in nanoseconds. Negative values are EGL's markers: -2 not known yet,
/// -1 never to be known.
using EglTime = std::int64_t;

/// The times of one frame of a window (EGL_ANDROID_get_frame_timestamps), and the time at which it
/// is to be shown (EGL_ANDROID_presentation_time).
///
/// Owner    the caller, who deletes it; one object for each frame to be measured.
/// Threads  used on the render thread whose surface it measures.
/// Failure  false or 0, with an ERROR line when EGL refused. Nothing throws.
class NIB_EXPORT EglFrameTime
{
public:
    /// A moment in the life of a frame.
    enum class FrameTimestamp : unsigned
    {
        RequestedPresentTime = 0,
        RenderingCompleteTime = 1,
        CompositionLatchTime = 2,
        FirstCompositionStartTime = 3,
        LastCompositionStartTime = 4,
        FirstCompositionGpuFinishedTime = 5,
        DisplayPresentTime = 6,
        DequeueReadyTime = 7,
        ReadsDoneTime = 8,
    };

    /// A time of the compositor.
    enum class CompositorTiming : unsigned
    {
        CompositeDeadline = 0,
        CompositeInterval = 1,
        CompositeToPresentLatency = 2,
    };

    /// For the next frame of the calling thread's current draw surface. Call it before that frame
    /// is presented, and ask for its times afterwards.
    /// @return an object that the caller owns; null when the display has no frame times, there is
    ///         no current surface, or EGL refuses
    static EglFrameTime* GetForNextFrame();

    /// Whether the display gives frame times at all.
    static bool IsFrameTimestampSupported();

    virtual ~EglFrameTime();

    /// Whether the surface gives a time of the frame.
    virtual bool IsTimestampSupported(FrameTimestamp timestamp) const = 0;
    /// Whether the surface gives a time of the compositor.
    virtual bool IsCompositorTimingSupported(CompositorTiming timing) const = 0;

    /// A time of the frame; 0 when EGL refuses.
    virtual EglTime GetFrameTimestamp(FrameTimestamp timestamp) const = 0;

    /// A time of the compositor; 0 when EGL refuses.
    virtual EglTime GetCompositorTiming(CompositorTiming timing) const = 0;

    /// Asks that the surface's next frame be shown not before @p time.
    virtual bool SetPresentationTime(EglTime time) const = 0;
};

/// Whether the display lets a frame's presentation time be set.
NIB_EXPORT bool IsPresentationTimeSupported();

} // namespace Nib

#endif
