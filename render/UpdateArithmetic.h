#ifndef NIB_RENDER_UPDATE_ARITHMETIC_H
#define NIB_RENDER_UPDATE_ARITHMETIC_H

#include <nib/base.h>
#include <nib/partial_update.h>

// Rectangles of a partial update: no state, no driver. Window coordinates have y growing downward,
// GL boxes have their origin at the bottom left; both are in pixels.

namespace Nib
{

/// A GL scissor box. The same layout as what EGL takes for damage.
using ScissorBox = UpdateRectangle::DamageRect;

/// The size of a surface.
struct ScreenSize
{
    int width;
    int height;
};

constexpr ScissorBox FullScreen(const ScreenSize& screen)
{
    return {0, 0, screen.width, screen.height};
}

/// The part of @p rect that is on the screen; all zero when none of it is.
RectF ClipToScreen(const RectF& rect, const ScreenSize& screen);

/// Turns @p rect upside down and drops fractions.
ScissorBox FlippedBox(const RectF& rect, const ScreenSize& screen);

/// Drops fractions, without turning.
ScissorBox WindowBox(const RectF& rect);

/// Grows @p box to whole tiles of @p tileSize pixels. The GPU's tiles lie in the panel's own
/// orientation, so that @p rotationIndex, in quarter turns, says from which edges of the screen
/// they are counted: 0 left and bottom, 1 right and bottom, 2 right and top, 3 left and top; below
/// 0 right and top.
ScissorBox AlignedToTiles(const ScissorBox& box, const ScreenSize& screen, int tileSize,
                          int rotationIndex);

/// The damage of a frame whose dirty rectangles have the bounding box @p bounds: clipped, rounded
/// outward, turned upside down. The full screen when nothing of it is on the screen.
ScissorBox DamageOfFrame(const RectF& bounds, const ScreenSize& screen);

} // namespace Nib

#endif
