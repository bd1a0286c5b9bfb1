#ifndef NIB_RENDER_FRAME_DAMAGE_H
#define NIB_RENDER_FRAME_DAMAGE_H

#include <nib/base.h>
#include <nib/partial_update.h>

namespace Nib::GLES
{

/// What one frame changes of its window, for displays that are told so at the swap. Render thread
/// only.
class FrameDamage
{
public:
    /// The frame also changes @p rect: pixels, y growing downward.
    void Add(const RectF& rect);

    /// Ends the frame: the bounding box of what it changes, inside a screen of this size, in whole
    /// pixels that cover it, counted from the bottom left. All of the screen when nothing of it is
    /// known to change, so that a frame is never presented with an empty damage.
    UpdateRectangle::DamageRect Take(int screenWidth, int screenHeight);

private:
    RectF m_bounds;
};

} // namespace Nib::GLES

#endif
