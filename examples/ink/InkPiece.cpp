#include "InkPiece.h"

#include <cmath>

namespace Ink
{

Nib::RectF InkPiece::Bounds() const
{
    if (IsEmpty())
        return Nib::RectF();
    const float x = band.empty() ? dabs.front().x : band.front().x;
    const float y = band.empty() ? dabs.front().y : band.front().y;
    Nib::RectF box(x, y, x, y);
    for (const Vertex& vertex : band)
        box.MakeRect(vertex.x, vertex.y);
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
