#ifndef INK_MARKER_BRUSH_H
#define INK_MARKER_BRUSH_H

#include "BandPainter.h"
#include "Brush.h"
#include "CoatPainter.h"

namespace Ink
{

/// Lays one coat over the page, however often a stroke crosses itself. While the stroke grows, two
/// further pages know what lay below it and how far it covers each pixel: the greatest coverage of
/// all its bands (blending with the maximum). The page shows one coat of that over what lay below.
///
/// Both are looked after within the box around the stroke alone, so that a stroke costs what its
/// own area costs, and other brushes may paint between two strokes.
class MarkerBrush : public Brush
{
public:
    /// For pages of this size.
    MarkerBrush(int width, int height);

    void Paint(const InkPiece& piece, Page& page) override;
    void Suspend() override;
    void Resume() override;

private:
    void GrowTo(const PixelRect& area, Page& page);
    void Cover(const InkPiece& piece);

    Page m_below;    ///< the page without the stroke, within m_reach
    Page m_coverage; ///< of the stroke, within m_reach
    PixelRect m_reach;
    BandPainter m_band;
    CoatPainter m_coat;
    Owned<Nib::IBlendStateObject> m_greatest;
};

} // namespace Ink

#endif
