#include "oracle/Recorded.h"

#include "Recording.h"

#include <algorithm>

namespace Oracle
{

namespace
{

constexpr float kPageWidth = 100;
constexpr float kPageHeight = 75;
constexpr float kLineWidth = 1.3F;

Nib::RectF BoundsOf(const Ink::Recording& recording)
{
    const Ink::Sample& first = recording.strokes.front().front();
    Nib::RectF bounds(first.x, first.y, first.x, first.y);
    for (const Ink::Stroke& stroke : recording.strokes)
    {
        for (const Ink::Sample& sample : stroke)
            bounds.MakeRect(sample.x, sample.y);
    }
    return bounds;
}

/// The window's rectangle around a line between two samples.
class Line
{
public:
    explicit Line(const Nib::RectF& bounds)
        : m_left(bounds.left), m_top(bounds.top),
          m_scale(std::min(kPageWidth / std::max(bounds.Width(), 1e-3F),
                           kPageHeight / std::max(bounds.Height(), 1e-3F)))
    {
    }

    Nib::RectF Around(const Ink::Sample& a, const Ink::Sample& b) const
    {
        const float half = kLineWidth / 2;
        return {X(std::min(a.x, b.x)) - half, Y(std::min(a.y, b.y)) - half,
                X(std::max(a.x, b.x)) + half, Y(std::max(a.y, b.y)) + half};
    }

private:
    float X(float x) const { return (x - m_left) * m_scale; }
    float Y(float y) const { return (y - m_top) * m_scale; }

    float m_left;
    float m_top;
    float m_scale;
};

} // namespace

Scenario FromRecording(const std::string& path, int samplesPerFrame)
{
    const Ink::Recording recording = Ink::ReadRecording(path);
    const Line line(BoundsOf(recording));
    Scenario scenario;
    scenario.width = static_cast<int>(kPageWidth);
    scenario.height = static_cast<int>(kPageHeight);
    scenario.frames.emplace_back(); // the empty page
    int samples = 0;
    for (const Ink::Stroke& stroke : recording.strokes)
    {
        for (std::size_t i = 0; i < stroke.size(); ++i)
        {
            if (samples++ % samplesPerFrame == 0)
                scenario.frames.emplace_back();
            scenario.frames.back().dirty.push_back(
                line.Around(stroke[i == 0 ? 0 : i - 1], stroke[i]));
        }
    }
    return scenario;
}

} // namespace Oracle
