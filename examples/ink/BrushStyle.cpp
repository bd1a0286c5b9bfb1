#include "BrushStyle.h"

#include <algorithm>
#include <cmath>
#include <iterator>

namespace Ink
{
namespace
{

constexpr float kThinnest = 0.35f; // pixels; below it a stroke breaks into dots
constexpr float kFlattest = 2.5f;  // times its width, the longest that a leaning stamp gets
constexpr float kRadians = 3.14159265f / 180.0f;

/// What sets one kind of brush apart from the others.
struct Manner
{
    std::string_view name;
    BrushStyle style;
    float opacity;  // of one coat
    float lightest; // share of the width when the pen barely touches
    float faintest; // share of the flow when the pen barely touches
    bool leans;     // stretched as the pen is tilted
};

// Indexed by the kind.
constexpr Manner kManners[] = {
    {"pen", {BrushKind::Pen, {0.09f, 0.13f, 0.33f, 1.0f}, 6.0f}, 1.0f, 0.2f, 1.0f, false},
    {"marker", {BrushKind::Marker, {1.0f, 0.72f, 0.0f, 1.0f}, 22.0f}, 0.5f, 1.0f, 1.0f, false},
    {"stamp", {BrushKind::Stamp, {0.30f, 0.16f, 0.10f, 1.0f}, 26.0f}, 1.0f, 0.4f, 0.1f, true},
};
static_assert(std::size(kManners) == 3, "one row per BrushKind");

const Manner& MannerOf(BrushKind kind)
{
    return kManners[static_cast<int>(kind)];
}

float Between(float lowest, float share)
{
    return lowest + (1.0f - lowest) * share;
}

} // namespace

std::optional<BrushKind> BrushNamed(std::string_view name)
{
    for (const Manner& manner : kManners)
        if (manner.name == name)
            return manner.style.kind;
    return std::nullopt;
}

BrushStyle DefaultStyle(BrushKind kind)
{
    return MannerOf(kind).style;
}

Colour CoatOf(const BrushStyle& style)
{
    Colour coat = style.colour;
    coat.alpha *= MannerOf(style.kind).opacity;
    return coat;
}

PenPoint ToPage(const Sample& sample, const Placement& placement, const BrushStyle& style)
{
    const Manner& manner = MannerOf(style.kind);
    const float pressure = std::clamp(sample.pressure, 0.0f, 1.0f);
    PenPoint point;
    point.x = sample.x * placement.scale + placement.offsetX;
    point.y = sample.y * placement.scale + placement.offsetY;
    point.radius = std::max(style.width * Between(manner.lightest, pressure) / 2.0f, kThinnest);
    point.flow = Between(manner.faintest, pressure);
    if (manner.leans)
    {
        const float rise = std::sin(std::clamp(sample.altitude, 0.0f, 90.0f) * kRadians);
        point.stretch = 1.0f / std::max(rise, 1.0f / kFlattest);
        point.angle = sample.azimuth * kRadians;
    }
    return point;
}

} // namespace Ink
