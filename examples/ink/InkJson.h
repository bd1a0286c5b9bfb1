#ifndef INK_INK_JSON_H
#define INK_INK_JSON_H

#include "Recording.h"

namespace Ink
{

/// Reads JSON of two shapes, each an object. @p path only names the file in errors. Throws
/// ReadError.
/// - Pointer events in columns: arrays of numbers of one length named x, y, time (milliseconds),
///   pressure (0..1), buttons, tiltX and tiltY (degrees); y grows downward. The pen is down while
///   bit 0 of buttons is set; without buttons, while the pressure is above 0.
/// - Named strokes: arrays of points, each [x, y], [x, y, pressure], [x, y, pressure, time in
///   milliseconds] or {"x": x, "y": y}.
Recording ReadInkJson(const std::string& path, const std::string& text);

} // namespace Ink

#endif
