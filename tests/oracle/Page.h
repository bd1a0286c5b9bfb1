#ifndef NIB_TESTS_ORACLE_PAGE_H
#define NIB_TESTS_ORACLE_PAGE_H

#include "sim/SimDriver.h"

#include <nib/partial_update.h>

#include <vector>

namespace Oracle
{

using Box = Nib::UpdateRectangle::DamageRect; // pixels, y counted from the bottom

/// What a window is to show: rectangles, each painted in a colour of its own over those before it.
class Page
{
public:
    Page(int width, int height);

    /// Paints every pixel that @p rect (window coordinates, y downward) touches, in a new colour.
    void Paint(const Nib::RectF& rect);

    /// Draws the page with GL where @p box is, with scissored clears.
    void Draw(const Box& box) const;

    /// The page drawn in full: row by row, the bottom row first.
    const std::vector<SimPixel>& Pixels() const { return m_pixels; }

    int Width() const { return m_width; }
    int Height() const { return m_height; }
    Box All() const { return {0, 0, m_width, m_height}; }

private:
    struct Patch
    {
        Box box;
        SimPixel colour;
    };

    void Add(const Box& box);

    int m_width;
    int m_height;
    int m_colours = 0; // so many were used
    std::vector<Patch> m_patches;
    std::vector<SimPixel> m_pixels;
};

/// The pixels that @p rect (window coordinates) touches on a window of this size; all zero when
/// there are none.
Box TouchedPixels(const Nib::RectF& rect, int width, int height);

} // namespace Oracle

#endif
