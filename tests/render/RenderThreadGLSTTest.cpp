// The two surface render threads that the whole process shares.

#include "render/RenderTestSupport.h"

#include <nib/base.h>

#include <gtest/gtest.h>

using namespace Nib;

namespace
{

/// The priority of the context of @p thread, as EGL was asked for it.
int ContextPriority(const SimDriver& driver, RenderThreadGL* thread)
{
    const EGLContext context = AskOn(thread->GetMsgQueue(), [] { return eglGetCurrentContext(); });
    return driver.Context(context).priority;
}

TEST(RenderThreadGLST, TheFirstCallerMakesAndStartsTheThread)
{
    SimDriver driver;

    RenderThreadGL* thread = RenderThreadGLST::getInstance();

    ASSERT_NE(thread, nullptr);
    EXPECT_EQ(thread->GetType(), 1);
    EXPECT_STREQ(thread->GetMsgQueue()->getTag(), "RenderThreadGLST");
    EXPECT_NE(AskOn(thread->GetMsgQueue(), [] { return eglGetCurrentContext(); }), EGL_NO_CONTEXT);
    EXPECT_EQ(LinesWith(driver, "RenderThreadGLST::"),
              Lines({"I static Nib::RenderThreadGL *Nib::RenderThreadGLST::getInstance() - (nil)",
                     "I static Nib::RenderThreadGL *Nib::RenderThreadGLST::getInstance() - "
                     "Create"}));
    RenderThreadGLST::release();
}

TEST(RenderThreadGLST, HasMediumPriority)
{
    SimDriver driver(SimGpu::Default().WithEglExtension("EGL_IMG_context_priority"));

    EXPECT_EQ(ContextPriority(driver, RenderThreadGLST::getInstance()), 0x3102);

    RenderThreadGLST::release();
}

TEST(RenderThreadGLST, IsStartedWhenTheFirstCallReturns)
{
    SimDriver driver;

    RenderThreadGLST::getInstance();

    EXPECT_EQ(
        driver.CountLogContaining("bool Nib::GLES::RenderThreadGLImpl::Init() RenderThread: "), 1u);
    RenderThreadGLST::release();
}

TEST(RenderThreadGLST, LaterCallersGetTheSameThread)
{
    SimDriver driver;
    RenderThreadGL* thread = RenderThreadGLST::getInstance();
    driver.ForgetLog();

    EXPECT_EQ(RenderThreadGLST::getInstance(), thread);

    EXPECT_EQ(LinesWith(driver, ""),
              Lines({"I static Nib::RenderThreadGL *Nib::RenderThreadGLST::getInstance() - " +
                     Hex(thread)}));
    RenderThreadGLST::release();
    RenderThreadGLST::release();
}

TEST(RenderThreadGLST, LivesUntilTheLastReference)
{
    SimDriver driver;
    RenderThreadGL* thread = RenderThreadGLST::getInstance();
    RenderThreadGLST::getInstance();
    driver.ForgetLog();

    RenderThreadGLST::release();

    EXPECT_TRUE(driver.Log().empty());
    EXPECT_TRUE(thread->GetMsgQueue()->waitForCompleting());

    RenderThreadGLST::release();

    const std::vector<std::string> lines = LinesWith(driver, "");
    EXPECT_EQ(lines.front(), "I static void Nib::RenderThreadGLST::release() - Destroy");
    EXPECT_EQ(driver.CountLogContaining("::~RenderThreadGLImpl()"), 1u);
    EXPECT_EQ(driver.Live().contexts, 1); // the shared one
}

TEST(RenderThreadGLST, AReleaseTooManyDoesNothing)
{
    SimDriver driver;
    RenderThreadGLST::getInstance();
    RenderThreadGLST::release();
    driver.ForgetLog();
    driver.ForgetCalls();

    RenderThreadGLST::release();

    EXPECT_TRUE(driver.Log().empty());
    EXPECT_EQ(driver.CallCount(), 0u);
}

TEST(RenderThreadGLST, IsMadeAnewAfterItsEnd)
{
    SimDriver driver;
    RenderThreadGLST::getInstance();
    RenderThreadGLST::release();
    driver.ForgetLog();

    RenderThreadGL* thread = RenderThreadGLST::getInstance();

    EXPECT_EQ(driver.CountLogContaining("RenderThreadGLST::getInstance() - (nil)"), 1u);
    EXPECT_EQ(driver.CountLogContaining("RenderThreadGLST::getInstance() - Create"), 1u);
    EXPECT_TRUE(thread->GetMsgQueue()->waitForCompleting());
    RenderThreadGLST::release(); // one reference, so the count had gone back to 0
    EXPECT_EQ(driver.CountLogContaining("RenderThreadGLST::release() - Destroy"), 1u);
}

TEST(RenderThreadGLST, ManyFirstCallersGetOneStartedThread)
{
    SimDriver driver;
    std::vector<RenderThreadGL*> seen(8);
    std::vector<std::thread> callers;

    for (RenderThreadGL*& slot : seen)
    {
        callers.emplace_back(
            [&slot]
            {
                slot = RenderThreadGLST::getInstance();
                EXPECT_TRUE(slot->GetMsgQueue()->waitForCompleting());
            });
    }
    for (std::thread& caller : callers)
        caller.join();

    for (RenderThreadGL* thread : seen)
        EXPECT_EQ(thread, seen.front());
    EXPECT_EQ(driver.CountLogContaining("RenderThreadGLST::getInstance() - Create"), 1u);
    for (int i = 0; i < 8; ++i)
        RenderThreadGLST::release();
    EXPECT_EQ(driver.CountLogContaining("RenderThreadGLST::release() - Destroy"), 1u);
}

TEST(RenderThreadLowRenderPriorityGLST, IsAThreadOfItsOwn)
{
    SimDriver driver;
    RenderThreadGL* usual = RenderThreadGLST::getInstance();
    driver.ForgetLog();

    RenderThreadGL* low = RenderThreadLowRenderPriorityGLST::getInstance();

    EXPECT_NE(low, usual);
    EXPECT_STREQ(low->GetMsgQueue()->getTag(), "RenderThreadLowRenderPriorityGLST");
    EXPECT_TRUE(low->GetMsgQueue()->waitForCompleting());
    EXPECT_EQ(LinesWith(driver, "PriorityGLST::"),
              Lines({"I static Nib::RenderThreadGL "
                     "*Nib::RenderThreadLowRenderPriorityGLST::getInstance() - (nil)",
                     "I static Nib::RenderThreadGL "
                     "*Nib::RenderThreadLowRenderPriorityGLST::getInstance() - Create"}));
    RenderThreadGLST::release();
    EXPECT_TRUE(low->GetMsgQueue()->waitForCompleting());
    RenderThreadLowRenderPriorityGLST::release();
}

TEST(RenderThreadLowRenderPriorityGLST, LivesUntilTheLastReference)
{
    SimDriver driver;
    RenderThreadGL* thread = RenderThreadLowRenderPriorityGLST::getInstance();
    EXPECT_EQ(RenderThreadLowRenderPriorityGLST::getInstance(), thread);
    driver.ForgetLog();

    RenderThreadLowRenderPriorityGLST::release();
    EXPECT_TRUE(driver.Log().empty());
    RenderThreadLowRenderPriorityGLST::release();
    RenderThreadLowRenderPriorityGLST::release(); // one too many

    EXPECT_EQ(LinesWith(driver, "PriorityGLST::"),
              Lines({"I static void Nib::RenderThreadLowRenderPriorityGLST::release() - Destroy"}));
}

TEST(RenderThreadLowRenderPriorityGLST, HasLowPriorityFromLevel29On)
{
    SimDriver driver(SimGpu::Default().WithEglExtension("EGL_IMG_context_priority"));
    System::SetSDKVersion(29);

    EXPECT_EQ(ContextPriority(driver, RenderThreadLowRenderPriorityGLST::getInstance()), 0x3103);

    RenderThreadLowRenderPriorityGLST::release();
}

TEST(RenderThreadLowRenderPriorityGLST, HasMediumPriorityBelowLevel29)
{
    SimDriver driver(SimGpu::Default().WithEglExtension("EGL_IMG_context_priority"));
    System::SetSDKVersion(28);

    EXPECT_EQ(ContextPriority(driver, RenderThreadLowRenderPriorityGLST::getInstance()), 0x3102);

    RenderThreadLowRenderPriorityGLST::release();
}

} // namespace
