#ifndef NIB_TOOLS_INFO_REPORT_TEXT_H
#define NIB_TOOLS_INFO_REPORT_TEXT_H

#include "DeviceReport.h"

#include <string>

/// The report for reading on a terminal, with colours when @p colours is set.
std::string ToText(const Report& report, bool colours);

#endif
