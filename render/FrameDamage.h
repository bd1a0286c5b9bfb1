#ifndef NIB_RENDER_FRAME_DAMAGE_H
#define NIB_RENDER_FRAME_DAMAGE_H

#include "render/UpdateArithmetic.h"

#include <utility>

namespace Nib::GLES
{

/// What one frame changes of its window, for displays that are told so at the swap. Render thread
/// only.
class FrameDamage
{
public:
    /// The frame also changes @p rect: window coordinates, in pixels.
    void Add(const RectF& rect) { m_bounds.Union(rect); }

    /// Ends the frame. All of the screen when nothing of it is known to change, so that no frame is
    /// presented with an empty damage.
    UpdateRectangle::DamageRect Take(const ScreenSize& screen)
    {
        return DamageOfFrame(std::exchange(m_bounds, RectF()), screen);
    }

private:
    RectF m_bounds; // of all that was added
};

} // namespace Nib::GLES

#endif
