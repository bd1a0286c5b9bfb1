#ifndef INK_INKML_H
#define INK_INKML_H

#include "Recording.h"

namespace Ink
{

/// Reads W3C InkML (Ink Markup Language, W3C Recommendation of 20 September 2011): the traces with
/// their channels X, Y, F (force) and T (time), in any order of the trace format, with explicit and
/// difference encoding. Other channels are read over. Pressures are scaled to 0..1 by the channel's
/// range, or by the greatest value found where it states none. @p path only names the file in
/// errors. Throws ReadError.
Recording ReadInkMl(const std::string& path, const std::string& text);

} // namespace Ink

#endif
