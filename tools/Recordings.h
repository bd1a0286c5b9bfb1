#ifndef NIB_TOOLS_RECORDINGS_H
#define NIB_TOOLS_RECORDINGS_H

#include "Recording.h"

#include <string>
#include <vector>

/// All of @p files as one recording, each behind the one before. Throws Ink::ReadError.
Ink::Recording ReadRecordings(const std::vector<std::string>& files);

#endif
