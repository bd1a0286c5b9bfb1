#ifndef INK_PLACEMENT_H
#define INK_PLACEMENT_H

#include "Recording.h"

namespace Ink
{

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

} // namespace Ink

#endif
