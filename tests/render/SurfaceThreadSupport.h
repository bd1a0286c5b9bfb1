#ifndef NIB_TESTS_RENDER_SURFACE_THREAD_SUPPORT_H
#define NIB_TESTS_RENDER_SURFACE_THREAD_SUPPORT_H

#include "render/RenderTestSupport.h"

#include <nib/egl.h>

#include <gtest/gtest.h>

/// The calls that make, end or bind EGL objects, or wait for the GPU.
inline std::vector<SimCall> ObjectCalls(const SimDriver& driver)
{
    return driver.Calls({"eglCreateContext", "eglDestroyContext", "eglCreatePbufferSurface",
                         "eglCreateWindowSurface", "eglDestroySurface", "eglMakeCurrent",
                         "glFinish"});
}

inline std::vector<std::string> NamesOf(const std::vector<SimCall>& calls)
{
    std::vector<std::string> names;
    for (const SimCall& call : calls)
        names.push_back(call.name);
    return names;
}

/// What eglMakeCurrent was called with, as "none", "pbuffer" or "window" each.
inline std::vector<std::string> CurrentSurfaces(const SimDriver& driver)
{
    std::vector<std::string> surfaces;
    for (const SimCall& call : driver.Calls("eglMakeCurrent"))
    {
        EXPECT_EQ(call.args.at(1), call.args.at(2)) << "draws and reads differ";
        const auto surface = const_cast<void*>(call.args.at(1).Pointer());
        if (surface == nullptr)
            surfaces.push_back("none");
        else
            surfaces.push_back(driver.Surface(surface).window ? "window" : "pbuffer");
    }
    return surfaces;
}

/// What ends, in the order of the log lines: "context", "worker", and "shaders" for their check.
inline std::vector<std::string> EndsInOrder(const SimDriver& driver)
{
    std::vector<std::string> order;
    for (const std::string& line : LinesWith(driver, ""))
    {
        if (line == "I void Nib::EglContext::Destroy()")
            order.push_back("context");
        if (line.find("ShaderManager::CheckEmpty()") != std::string::npos)
            order.push_back("shaders");
        if (line.find("WorkerThreadImpl() Cleanup") != std::string::npos)
            order.push_back("worker");
    }
    return order;
}

#endif
