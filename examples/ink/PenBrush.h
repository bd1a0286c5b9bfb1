#ifndef INK_PEN_BRUSH_H
#define INK_PEN_BRUSH_H

#include "BandPainter.h"
#include "Brush.h"

namespace Ink
{

/// Draws the band of a stroke straight onto the page. For opaque colours: where bands overlap, as
/// they do at every join, a translucent one would darken.
class PenBrush : public Brush
{
public:
    PenBrush();

    void Paint(const InkPiece& piece, Page& page) override;
    void Suspend() override { m_band.Suspend(); }
    void Resume() override { m_band.Resume(); }

private:
    BandPainter m_band;
    Owned<Nib::IBlendStateObject> m_over;
};

} // namespace Ink

#endif
