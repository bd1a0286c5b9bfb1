#ifndef NIB_TESTS_GLES_GL_CONTEXT_H
#define NIB_TESTS_GLES_GL_CONTEXT_H

#include "sim/SimDriver.h"

#include <nib/device.h>

#include <cstdio>
#include <string>
#include <utility>
#include <vector>

/// A device with a current context whose parameters were read, as on a render thread that has
/// started; nothing is recorded yet.
struct GlContext
{
    explicit GlContext(SimGpu gpu = SimGpu::Default()) : driver(std::move(gpu)), context(driver)
    {
        Nib::OpenGLRenderer::InitParameters();
        Forget();
    }

    void Forget()
    {
        driver.ForgetCalls();
        driver.ForgetLog();
    }

    /// The calls so far. Addresses of the library's own variables are no part of what is expected:
    /// they all stand as null.
    std::vector<SimCall> Issued() const
    {
        std::vector<SimCall> calls = driver.Calls();
        for (SimCall& call : calls)
        {
            for (SimValue& argument : call.args)
            {
                if (argument.GetKind() == SimValue::Kind::Pointer)
                    argument = SimValue(nullptr);
            }
        }
        return calls;
    }

    std::vector<std::string> Log(int priority) const { return driver.LogTexts(priority); }

    SimDriver driver;
    SimContext context;
};

using Texts = std::vector<std::string>;

/// As printf writes it; for lines that hold addresses and names.
template <typename... Arguments>
std::string Text(const char* format, Arguments... arguments)
{
    char text[1024];
    std::snprintf(text, sizeof(text), format, arguments...);
    return text;
}

inline const void* const kAddress = nullptr; ///< an address that GlContext::Issued left out

#endif
