#ifndef INK_INK_STROKE_H
#define INK_INK_STROKE_H

#include "InkPiece.h"

namespace Ink
{

/// A stroke while it is being written: takes the points of the pen and gives pieces of ink, which
/// InkSession::Draw puts onto the page. Touches no GL; used on one thread.
///
///     InkStroke stroke(style);
///     stroke.Add(ToPage(sample, placement, style));   // for each sample, and after the last
///     stroke.End();
///     session.Draw(stroke.Take());                    // whenever a frame is due, and at the end
class InkStroke
{
public:
    explicit InkStroke(const BrushStyle& style);

    void Add(const PenPoint& point);
    void End();

    /// What has become certain since the last Take: nothing more is to come for it.
    InkPiece Take();

private:
    InkPiece m_piece;
    StrokeMesh m_mesh; ///< of a pen and a marker
    DabTrail m_trail;  ///< of a stamp
};

} // namespace Ink

#endif
