#include "render/UpdateArithmetic.h"

#include <algorithm>
#include <climits>
#include <cstdint>

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

// Wider than the coordinates, whose sums may not fit them: nothing bounds a caller's rectangle.
using Wide = std::int64_t;

constexpr Wide RoundedDown(Wide value, Wide multiple)
{
    return value / multiple * multiple;
}

constexpr Wide RoundedUp(Wide value, Wide multiple)
{
    return (value + multiple - 1) / multiple * multiple;
}

struct Span
{
    Wide start;
    Wide length;
};

// Tiles are counted from where the screen's coordinates begin.
Span AlignedFromStart(const Span& span, Wide screen, Wide tileSize)
{
    const Wide start = RoundedDown(span.start, tileSize);
    const Wide end = RoundedUp(span.start + span.length, tileSize);
    return {start, std::min(screen, end) - start};
}

// Tiles are counted from where the screen ends.
Span AlignedFromEnd(const Span& span, Wide screen, Wide tileSize)
{
    const Wide distance = screen - span.start;
    const Wide start = std::max(screen - RoundedUp(distance, tileSize), Wide{0});
    return {start, screen - RoundedDown(distance - span.length, tileSize) - start};
}

int Narrowed(Wide value)
{
    return static_cast<int>(std::clamp(value, Wide{INT_MIN}, Wide{INT_MAX}));
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
    return {Narrowed(horizontal.start), Narrowed(vertical.start), Narrowed(horizontal.length),
            Narrowed(vertical.length)};
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
