#ifndef INK_STROKE_LIST_H
#define INK_STROKE_LIST_H

#include "Recording.h"

namespace Ink
{

/// Reads strokes as lists of points: a line START, then lines "x,y,t" (y negative downward, t in
/// milliseconds), and a line BREAK behind each stroke. @p path only names the file in errors.
/// Throws ReadError.
Recording ReadStrokeList(const std::string& path, const std::string& text);

} // namespace Ink

#endif
