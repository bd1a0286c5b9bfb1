#include "InkPiece.h"

#include <algorithm>
#include <cmath>

namespace Ink
{

Nib::RectF InkPiece::Bounds() const
{
    if (IsEmpty())
        return Nib::RectF();
    const float x = band.empty() ? dabs.front().x : band.front().x;
    const float y = band.empty() ? dabs.front().y : band.front().y;
    float left = x, top = y, right = x, bottom = y; // apart, so that they stay in registers
    for (const Vertex& vertex : band)
    {
        left = std::min(left, vertex.x);
        top = std::min(top, vertex.y);
        right = std::max(right, vertex.x);
        bottom = std::max(bottom, vertex.y);
    }
    Nib::RectF box(left, top, right, bottom);
    for (const Dab& dab : dabs)
    {
        // A dab is turned, so that its corners are anywhere within its half diagonal.
        const float reach = std::hypot(dab.alongX, dab.alongY) + dab.breadth;
        box.MakeRect(dab.x - reach, dab.y - reach);
        box.MakeRect(dab.x + reach, dab.y + reach);
    }
    return box;
}

} // namespace Ink
