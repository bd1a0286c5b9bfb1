#ifndef INK_PEN_LOG_H
#define INK_PEN_LOG_H

#include "Recording.h"

namespace Ink
{

/// Reads a pen log: one sample a line, four numbers between blanks, namely the time in seconds, x
/// and y in pixels (y downward) and the pressure from 0 to 1. The pen is down while the pressure is
/// above 0. @p path only names the file in errors. Throws ReadError.
Recording ReadPenLog(const std::string& path, const std::string& text);

} // namespace Ink

#endif
