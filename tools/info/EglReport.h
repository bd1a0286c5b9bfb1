#ifndef NIB_TOOLS_INFO_EGL_REPORT_H
#define NIB_TOOLS_INFO_EGL_REPORT_H

#include "DeviceReport.h"

#include <string>

/// The display: identity and extensions. @p failure is what its start logged as errors.
Report ReadEgl(const std::string& failure);

/// Every configuration of the display, and why it was chosen or not.
Report ReadConfigurations();

/// The words of a text in which spaces separate them, such as a list of extensions.
Report Words(const char* text);

#endif
