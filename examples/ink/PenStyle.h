#ifndef INK_PEN_STYLE_H
#define INK_PEN_STYLE_H

#include "InkPainter.h"
#include "Recording.h"
#include "StrokeMesh.h"

namespace Ink
{

/// How a pen writes.
struct PenStyle
{
    Colour colour{0.09f, 0.13f, 0.33f, 1.0f};
    float width = 6.0f; ///< page pixels at full pressure; a fifth of it with none
};

/// How a recording's units come onto the page: scaled alike in both directions, then moved.
struct Placement
{
    float scale = 1.0f;
    float offsetX = 0.0f;
    float offsetY = 0.0f;
};

/// The placement that shows all of @p recording as large as a page of @p width x @p height pixels
/// allows, with a margin.
Placement FitToPage(const Recording& recording, int width, int height);

/// Where @p sample falls on the page, and how wide the pen writes there.
PenPoint ToPage(const Sample& sample, const Placement& placement, const PenStyle& style);

} // namespace Ink

#endif
