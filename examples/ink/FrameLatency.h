#ifndef INK_FRAME_LATENCY_H
#define INK_FRAME_LATENCY_H

#include <nib/egl_timing.h>

#include <cstddef>
#include <deque>
#include <memory>
#include <string>
#include <vector>

namespace Ink
{

/// How long the frames of a window took from the pen's event to the display, by what the system
/// tells of them some frames later. Used on the render thread, in tasks.
class FrameLatency
{
public:
    /// A system remembers the times of so many frames.
    static constexpr std::size_t kRemembered = 8;
    /// Times of so many frames are kept; the oldest go first.
    static constexpr std::size_t kKept = 1000;

    /// Before a frame is presented: asks for its times, if the system tells any.
    /// @param event  when the oldest event came that the frame is the first to show, on the clock
    ///               of frame times, which on Android is that of events
    void BeginFrame(Nib::EglTime event);

    /// As above, with what tells the times of the frame; null is no frame.
    void Add(std::unique_ptr<Nib::EglFrameTime> frame, Nib::EglTime event);

    /// Before the window goes: frames whose times are not known by now are not counted.
    void Forget() { m_pending.clear(); }

    /// Milliseconds of each frame that has been shown, in the order of the frames.
    const std::deque<float>& Times();

    /// p50 and p99 for people, in one line without its end.
    std::string Summary();

private:
    struct Frame
    {
        std::unique_ptr<Nib::EglFrameTime> times;
        Nib::EglTime event;
    };

    void Collect();
    void Keep(float time);

    std::deque<Frame> m_pending;
    std::deque<float> m_times;
};

} // namespace Ink

#endif
