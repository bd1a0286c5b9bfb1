#ifndef INK_INK_PIECE_H
#define INK_INK_PIECE_H

#include "BrushStyle.h"
#include "DabTrail.h"
#include "StrokeMesh.h"

#include <nib/base.h>

#include <vector>

namespace Ink
{

/// A piece of one stroke, ready to be painted. The pieces of a stroke are painted in order, and
/// none of another stroke between them.
struct InkPiece
{
    BrushStyle style;
    bool startsStroke = false;
    std::vector<Vertex> band; ///< of a pen and a marker: triangles, three vertices each
    std::vector<Dab> dabs;    ///< of a stamp

    bool IsEmpty() const { return band.empty() && dabs.empty(); }

    /// The box around the ink, in page pixels. Empty for no ink.
    Nib::RectF Bounds() const;
};

} // namespace Ink

#endif
