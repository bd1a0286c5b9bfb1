#include "render/UpdateArithmetic.h"

#include <algorithm>
#include <climits>

namespace Nib
{

namespace
{

// Toward zero; what no int can hold becomes the nearest one, and what is not a number becomes 0.
int Truncated(float value)
{
    if (value != value)
        return 0;
    if (value >= 2147483648.0F)
        return INT_MAX;
    if (value < -2147483648.0F)
        return INT_MIN;
    return static_cast<int>(value);
}

constexpr int RoundedDown(int value, int multiple)
{
    return value / multiple * multiple;
}

constexpr int RoundedUp(int value, int multiple)
{
    return (value + multiple - 1) / multiple * multiple;
}

struct Span
{
    int start;
    int length;
};

// Tiles are counted from where the screen's coordinates begin.
Span AlignedFromStart(const Span& span, int screen, int tileSize)
{
    const int start = RoundedDown(span.start, tileSize);
    const int end = RoundedUp(span.start + span.length, tileSize);
    return {start, std::min(screen, end) - start};
}

// Tiles are counted from where the screen ends.
Span AlignedFromEnd(const Span& span, int screen, int tileSize)
{
    const int distance = screen - span.start;
    const int start = std::max(screen - RoundedUp(distance, tileSize), 0);
    return {start, screen - RoundedDown(distance - span.length, tileSize) - start};
}

} // namespace

RectF ClipToScreen(const RectF& rect, const ScreenSize& screen)
{
    RectF clipped = rect;
    const RectF all(0, 0, static_cast<float>(screen.width), static_cast<float>(screen.height));
    return clipped.Intersect(all) ? clipped : RectF();
}

ScissorBox FlippedBox(const RectF& rect, const ScreenSize& screen)
{
    return {Truncated(rect.left), Truncated(static_cast<float>(screen.height) - rect.bottom),
            Truncated(rect.Width()), Truncated(rect.Height())};
}

ScissorBox WindowBox(const RectF& rect)
{
    return {Truncated(rect.left), Truncated(rect.top), Truncated(rect.Width()),
            Truncated(rect.Height())};
}

ScissorBox AlignedToTiles(const ScissorBox& box, const ScreenSize& screen, int tileSize,
                          int rotationIndex)
{
    const bool fromLeft = rotationIndex == 0 || rotationIndex == 3;
    const bool fromTop = static_cast<unsigned>(rotationIndex) > 1;
    const Span horizontal = fromLeft ? AlignedFromStart({box.x, box.width}, screen.width, tileSize)
                                     : AlignedFromEnd({box.x, box.width}, screen.width, tileSize);
    const Span vertical = fromTop ? AlignedFromEnd({box.y, box.height}, screen.height, tileSize)
                                  : AlignedFromStart({box.y, box.height}, screen.height, tileSize);
    return {horizontal.start, vertical.start, horizontal.length, vertical.length};
}

ScissorBox DamageOfFrame(const RectF& bounds, const ScreenSize& screen)
{
    RectF damage = ClipToScreen(bounds, screen);
    if (damage.IsEmpty())
        return FullScreen(screen);
    damage.ExtendRect();
    return FlippedBox(damage, screen);
}

} // namespace Nib
