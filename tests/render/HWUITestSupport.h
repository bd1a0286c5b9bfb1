#ifndef NIB_TESTS_RENDER_HWUI_TEST_SUPPORT_H
#define NIB_TESTS_RENDER_HWUI_TEST_SUPPORT_H

#include "render/HWUIThreadGLImpl.h"
#include "render/RenderTestSupport.h"

#include <nib/device.h>

#include <gtest/gtest.h>

#include <optional>

/// A UI with its context current on the test's thread, and a render thread inside it. Other threads
/// ask for frames through the callback; the test draws them.
class HwuiTest : public testing::Test
{
protected:
    HwuiTest()
    {
        context.emplace(driver);
        Nib::OpenGLRenderer::InitParameters(); // so that no test needs a frame for it
        thread = std::make_unique<Nib::GLES::HWUIThreadGLImpl>(&callback, "hwui");
    }

    Nib::IGLMsgQueue* Queue() { return thread->GetMsgQueue(); }

    static bool Invoke(void* first, void* context, int last)
    {
        auto* test = static_cast<HwuiTest*>(context);
        EXPECT_EQ(first, nullptr);
        EXPECT_EQ(last, 0);
        ++test->requests;
        return test->ready;
    }

    SimDriver driver;
    std::optional<SimContext> context;
    std::atomic<int> requests{0};
    std::atomic<bool> ready{true};
    Nib::HwuiCallback callback{nullptr, &HwuiTest::Invoke, this};
    std::unique_ptr<Nib::GLES::HWUIThreadGLImpl> thread;
};

#endif
