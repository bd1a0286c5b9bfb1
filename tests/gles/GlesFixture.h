#ifndef NIB_TESTS_GLES_FIXTURE_H
#define NIB_TESTS_GLES_FIXTURE_H

#include "gles/BoundQueue.h"
#include "sim/SimDriver.h"

#include <nib/device.h>

#include <gtest/gtest.h>

#include <string>
#include <vector>

using Texts = std::vector<std::string>;

/// A thread with a context and a queue that manages objects, as a render thread has them.
class GlesTest : public testing::Test
{
protected:
    explicit GlesTest(SimGpu gpu = SimGpu::Default()) : driver(std::move(gpu)), context(driver)
    {
        driver.ForgetCalls();
        driver.ForgetLog();
    }

    /// The calls as text; generated and deleted names stand for the arrays that hold them.
    Texts CallTexts() const
    {
        Texts texts;
        for (const SimCall& call : driver.Calls())
        {
            const bool isNames = call.name.rfind("glGen", 0) == 0 ||
                                 (call.name.rfind("glDelete", 0) == 0 && call.args.size() == 2);
            texts.push_back(isNames ? NamesText(call) : call.ToString());
        }
        return texts;
    }

    /// The error lines of the log.
    Texts Errors() const { return driver.LogTexts(ANDROID_LOG_ERROR); }
    /// The information lines of the log.
    Texts Infos() const { return driver.LogTexts(ANDROID_LOG_INFO); }

    static std::string NamesText(const SimCall& call)
    {
        std::string text = call.name + "(";
        for (const long long name : call.list)
            text += (text.back() == '(' ? "" : ", ") + std::to_string(name);
        return text + ")";
    }

    SimDriver driver;
    SimContext context;
    BoundQueue queue;
};

/// The same on a device without sampler objects, as far as the library goes by its version.
class GlesTestWithoutSamplers : public GlesTest
{
protected:
    GlesTestWithoutSamplers() : GlesTest(SimGpu::Default().WithVersion("OpenGL ES 3.0 V@145.0"))
    {
        Nib::OpenGLRenderer::getSupportSampler();
        driver.ForgetCalls();
        driver.ForgetLog();
    }
};

/// Ends objects of the factory's kind.
struct Releaser
{
    template <typename T>
    void operator()(T* object) const
    {
        object->Release();
    }
};

#endif
