#include "render/FrameDamage.h"

#include <utility>

namespace Nib::GLES
{

void FrameDamage::Add(const RectF& rect)
{
    m_bounds.Union(rect);
}

UpdateRectangle::DamageRect FrameDamage::Take(int screenWidth, int screenHeight)
{
    RectF area = std::exchange(m_bounds, RectF());
    const RectF screen(0.0f, 0.0f, static_cast<float>(screenWidth),
                       static_cast<float>(screenHeight));
    if (area.IsEmpty() || !area.Intersect(screen) || area.IsEmpty())
        return {0, 0, screenWidth, screenHeight};

    area.ExtendRect();
    Rect pixels;
    pixels = area;
    return {pixels.left, screenHeight - pixels.bottom, pixels.Width(), pixels.Height()};
}

} // namespace Nib::GLES
