#ifndef NIB_TOOLS_INFO_DEVICE_REPORT_H
#define NIB_TOOLS_INFO_DEVICE_REPORT_H

#include <nlohmann/json.hpp>

/// What is known of the device: one member a section, in the order of printing. What cannot be
/// known has the value null; where a section as a whole is missing, "missing" tells why.
using Report = nlohmann::ordered_json;

/// Opens EGL, starts a render thread and asks both; stops the thread before it returns.
Report ReadDeviceReport();

#endif
