#include "InfoCommand.h"

#include "info/DeviceReport.h"
#include "info/ReportText.h"

#include <cstdio>
#include <cstdlib>
#include <memory>

#include <unistd.h>

namespace
{

bool IsSet(const char* variable)
{
    const char* const value = getenv(variable);
    return value != nullptr && *value != '\0';
}

void Print(bool json)
{
    // Without a display server the driver is asked for pbuffers alone.
    if (!IsSet("DISPLAY") && !IsSet("WAYLAND_DISPLAY"))
        setenv("EGL_PLATFORM", "surfaceless", 0);
    const Report report = ReadDeviceReport();
    const bool colours = !json && isatty(STDOUT_FILENO) != 0 && !IsSet("NO_COLOR");
    const std::string text = json ? report.dump(2) + '\n' : ToText(report, colours);
    std::fputs(text.c_str(), stdout);
}

} // namespace

void AddInfoCommand(CLI::App& app)
{
    CLI::App* const info =
        app.add_subcommand("info", "Tell what the library finds on this device and why it "
                                   "draws the way it does");
    const auto json = std::make_shared<bool>(false);
    info->add_flag("--json", *json, "As JSON, in the form that docs/nib-info.md describes");
    info->callback([json] { Print(*json); });
}
