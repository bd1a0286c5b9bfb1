// The driver that a run is for is the one that draws, whatever else is installed.

#include "drivers/DriverContext.h"

#include <map>
#include <string>

namespace
{

/// What GL_RENDERER of each driver holds.
const std::map<std::string_view, std::array<const char*, 2>> kRenderers = {
    {"surfaceless", {"llvmpipe", "llvmpipe"}},
    {"x11", {"llvmpipe", "llvmpipe"}},
    {"softpipe", {"softpipe", "softpipe"}},
    {"zink", {"zink", "llvmpipe"}},
    {"wayland", {"llvmpipe", "llvmpipe"}},
    {"angle", {"ANGLE", "SwiftShader Device"}},
    {"angle-lavapipe", {"ANGLE", "llvmpipe"}},
    {"swiftshader", {"Google SwiftShader", "Google SwiftShader"}},
};

TEST_F(DriverContext, IsOfTheDriverThatTheRunIsFor)
{
    const auto found = kRenderers.find(DriverName());
    if (found == kRenderers.end())
        GTEST_SKIP() << "no driver was asked for";

    const std::string renderer = reinterpret_cast<const char*>(glGetString(GL_RENDERER));

    for (const char* part : found->second)
        EXPECT_NE(renderer.find(part), std::string::npos) << renderer;
}

} // namespace
