// Tests that are to run on X11 where no X server is named are skipped as a whole, with the reason.

#include <cstdio>
#include <cstdlib>
#include <cstring>

namespace
{

constexpr int kSkipped = 77; // as the test's properties say

const bool s_isChecked = []
{
    const char* const platform = std::getenv("EGL_PLATFORM");
    const char* const display = std::getenv("DISPLAY");
    if (platform && std::strcmp(platform, "x11") == 0 && (!display || !*display))
    {
        std::puts("skipped: there is no X server, DISPLAY is unset");
        std::exit(kSkipped);
    }
    return true;
}();

} // namespace
