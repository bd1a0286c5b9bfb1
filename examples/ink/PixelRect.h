#ifndef INK_PIXEL_RECT_H
#define INK_PIXEL_RECT_H

#include <nib/base.h>

#include <vector>

namespace Ink
{

/// Whole pixels of a page, y downward; the right column and the bottom row are the first outside.
struct PixelRect
{
    int left = 0;
    int top = 0;
    int right = 0;
    int bottom = 0;

    int Width() const { return right - left; }
    int Height() const { return bottom - top; }
    bool IsEmpty() const { return left >= right || top >= bottom; }
    friend bool operator==(const PixelRect&, const PixelRect&) = default;
};

/// The pixels of a page of @p width x @p height that @p box touches.
PixelRect PixelsIn(const Nib::RectF& box, int width, int height);

/// The box around both; an empty one adds nothing.
PixelRect Union(const PixelRect& a, const PixelRect& b);

/// What lies in @p outer and not in @p inner, which lies in @p outer or is empty: at most four
/// rectangles, none of them empty, that do not overlap.
std::vector<PixelRect> Around(const PixelRect& inner, const PixelRect& outer);

} // namespace Ink

#endif
