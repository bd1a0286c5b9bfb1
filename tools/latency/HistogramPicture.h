#ifndef NIB_TOOLS_LATENCY_HISTOGRAM_PICTURE_H
#define NIB_TOOLS_LATENCY_HISTOGRAM_PICTURE_H

#include "latency/Histogram.h"

#include <string>
#include <vector>

/// Draws @p series, a panel each over one axis of time, into the PNG file @p path. Throws UserError.
void WriteHistogram(const std::string& path, const std::vector<LatencySeries>& series);

#endif
