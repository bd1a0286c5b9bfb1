#ifndef INK_PEN_POINT_H
#define INK_PEN_POINT_H

namespace Ink
{

/// A point of a stroke on the page, and how its brush touches the page there.
struct PenPoint
{
    float x = 0.0f;       ///< page pixels, to the right
    float y = 0.0f;       ///< page pixels, downward
    float radius = 1.0f;  ///< half the width of the stroke here, in pixels
    float flow = 1.0f;    ///< share of its ink that the brush gives here; stamps alone look at it
    float angle = 0.0f;   ///< radians, from the page's right, clockwise: where a stamp is stretched
    float stretch = 1.0f; ///< how many times longer than wide a stamp is here
};

} // namespace Ink

#endif
