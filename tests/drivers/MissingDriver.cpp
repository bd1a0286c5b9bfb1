// Tests for a driver that is not there are skipped as a whole, with the reason.

#include "drivers/Driver.h"

#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <string>

namespace
{

constexpr int kSkipped = 77; // as the test's properties say

std::string Setting(const char* name)
{
    const char* const value = std::getenv(name);
    return value != nullptr ? value : "";
}

/// Why the driver is missing; empty for one that is there.
std::string Missing()
{
    if (Setting("EGL_PLATFORM") == "x11" && Setting("DISPLAY").empty())
        return "there is no X server, DISPLAY is unset";
    if (Setting("EGL_PLATFORM") == "wayland" && Setting("WAYLAND_DISPLAY").empty())
        return "there is no Wayland compositor, WAYLAND_DISPLAY is unset";
    const std::string folder = Setting("NIB_DRIVER_FOLDER");
    if (!folder.empty() && !std::filesystem::exists(folder + "/libEGL.so.1"))
        return "the driver is not in " + folder + ", where scripts/setup drivers puts it";
    const std::string vulkan = Setting("VK_ICD_FILENAMES");
    if (!vulkan.empty() && !std::filesystem::exists(vulkan))
        return "there is no Vulkan driver " + vulkan;
    return "";
}

const bool s_isChecked = []
{
    const std::string reason = Missing();
    if (!reason.empty())
    {
        std::printf("skipped: %s\n", reason.c_str());
        std::exit(kSkipped);
    }
    return true;
}();

} // namespace
