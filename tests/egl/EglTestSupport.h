#ifndef NIB_TESTS_EGL_EGL_TEST_SUPPORT_H
#define NIB_TESTS_EGL_EGL_TEST_SUPPORT_H

#include "sim/SimDriver.h"

#include <nib/egl.h>

#include <string>
#include <utility>
#include <vector>

/// A device whose display is open, and no call or line recorded yet.
struct OpenDisplay
{
    explicit OpenDisplay(SimGpu gpu = SimGpu::Default())
        : driver(std::move(gpu)), egl(Nib::Egl::GetInstance())
    {
        driver.ForgetCalls();
        driver.ForgetLog();
    }

    SimDriver driver;
    Nib::Egl* egl;
};

inline std::vector<std::string> Lines(std::initializer_list<std::string> lines)
{
    return lines;
}

/// All lines so far, each behind the letter of its priority: "I text".
inline std::vector<std::string> AllLines(const SimDriver& driver)
{
    static constexpr const char* kLetters = "??VDIWEF";
    std::vector<std::string> lines;
    for (const SimLogLine& line : driver.Log())
        lines.push_back(std::string(1, kLetters[line.priority]) + " " + line.text);
    return lines;
}

/// The place of a configuration in the device's list, from 0; -1 for none.
inline int IndexOf(EGLConfig config)
{
    return static_cast<int>(reinterpret_cast<std::intptr_t>(config)) - 1;
}

/// A configuration with these bits.
inline SimConfig Bits(int red, int green, int blue, int alpha, int depth, int stencil)
{
    SimConfig config;
    config.red = red;
    config.green = green;
    config.blue = blue;
    config.alpha = alpha;
    config.depth = depth;
    config.stencil = stencil;
    return config;
}

#endif
