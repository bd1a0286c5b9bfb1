#ifndef INK_SVC_FILE_H
#define INK_SVC_FILE_H

#include "Recording.h"

namespace Ink
{

/// Reads samples of a graphics tablet: the first line is their number, then a line each with x, y
/// (growing upward), time, pen down (1) or up (0), azimuth and altitude (tenths of a degree, 900 is
/// upright) and pressure. Times are seconds, or milliseconds where they are whole numbers;
/// pressures are 0..1, or raw ones that the greatest found scales. More samples than the first line
/// says are taken, fewer are an error. @p path only names the file in errors. Throws ReadError.
Recording ReadSvcFile(const std::string& path, const std::string& text);

} // namespace Ink

#endif
