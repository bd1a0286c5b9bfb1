#ifndef NIB_TESTS_ORACLE_RECORDED_H
#define NIB_TESTS_ORACLE_RECORDED_H

#include "oracle/Scenario.h"

#include <string>

namespace Oracle
{

/// The dirty rectangles of a recording of pen strokes: around each two samples that follow each
/// other in a stroke, with the width of a line, on a page that the recording just fills. A frame
/// for each so many samples. Ages are not given yet. Throws Ink::ReadError.
Scenario FromRecording(const std::string& path, int samplesPerFrame);

} // namespace Oracle

#endif
