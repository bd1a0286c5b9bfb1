#include "PixelRect.h"

#include <algorithm>
#include <cmath>

namespace Ink
{

PixelRect PixelsIn(const Nib::RectF& box, int width, int height)
{
    const auto pixel = [](float edge, int size)
    { return static_cast<int>(std::clamp(edge, 0.0f, static_cast<float>(size))); };
    return {pixel(std::floor(box.left), width), pixel(std::floor(box.top), height),
            pixel(std::ceil(box.right), width), pixel(std::ceil(box.bottom), height)};
}

PixelRect Union(const PixelRect& a, const PixelRect& b)
{
    if (a.IsEmpty() || b.IsEmpty())
        return a.IsEmpty() ? b : a;
    return {std::min(a.left, b.left), std::min(a.top, b.top), std::max(a.right, b.right),
            std::max(a.bottom, b.bottom)};
}

std::vector<PixelRect> Around(const PixelRect& inner, const PixelRect& outer)
{
    if (inner.IsEmpty())
        return outer.IsEmpty() ? std::vector<PixelRect>() : std::vector<PixelRect>{outer};
    std::vector<PixelRect> strips = {
        {outer.left, outer.top, outer.right, inner.top},
        {outer.left, inner.bottom, outer.right, outer.bottom},
        {outer.left, inner.top, inner.left, inner.bottom},
        {inner.right, inner.top, outer.right, inner.bottom},
    };
    std::erase_if(strips, [](const PixelRect& strip) { return strip.IsEmpty(); });
    return strips;
}

} // namespace Ink
