#ifndef INK_INK_ML_WRITER_H
#define INK_INK_ML_WRITER_H

#include "Recording.h"

#include <string>

namespace Ink
{

/// @p recording as W3C InkML: a trace a stroke, in the order of time, with place, pressure, time,
/// azimuth and altitude. ReadInkMl gives the same samples back, to the bit, when no time is
/// negative and none decreases.
std::string ToInkMl(const Recording& recording);

} // namespace Ink

#endif
