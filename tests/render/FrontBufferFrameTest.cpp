// The front-buffer render thread: the switch to the front buffer, frames, scissor boxes.

#include "render/RenderThreadFBRImpl.h"
#include "render/SurfaceThreadSupport.h"

#include <nib/base.h>
#include <nib/device.h>

#include <optional>

using namespace Nib;

namespace
{

constexpr EGLint kAutoRefresh = 0x314C; // EGL_FRONT_BUFFER_AUTO_REFRESH_ANDROID

class FrontBufferFrame : public testing::Test
{
protected:
    void Start(const SimGpu& gpu = SimGpu::Default().WithFrontBuffer())
    {
        driver.emplace(gpu);
        thread = std::make_unique<GLES::RenderThreadFBRImpl>(nullptr, "front");
        ASSERT_TRUE(thread->Start());
    }

    void Attach(int width = 1920, int height = 1080)
    {
        window = driver->Window(width, height);
        thread->OnSurfaceChanged(window, width, height, 0);
        driver->ForgetCalls();
        driver->ForgetLog();
    }

    /// The queries, settings and swaps of surfaces, as text without their handles.
    std::vector<std::string> SurfaceCalls() const
    {
        std::vector<std::string> texts;
        for (const SimCall& call :
             driver->Calls({"eglQuerySurface", "eglSurfaceAttrib", "eglSwapBuffers"}))
        {
            std::string text = call.name;
            if (call.args.size() > 2)
                text += call.Arg(2) == EGL_RENDER_BUFFER ? " RENDER_BUFFER"
                        : call.Arg(2) == kAutoRefresh    ? " AUTO_REFRESH"
                                                         : " another";
            if (call.name == "eglSurfaceAttrib")
                text += call.Arg(3) == EGL_SINGLE_BUFFER ? " SINGLE"
                        : call.Arg(3) == EGL_TRUE        ? " TRUE"
                                                         : " another";
            texts.push_back(text);
        }
        return texts;
    }

    std::vector<std::string> OwnLines() const
    {
        return LinesWith(*driver, "RenderThreadFBRImpl::");
    }

    std::optional<SimDriver> driver;
    std::unique_ptr<GLES::RenderThreadFBRImpl> thread;
    ANativeWindow* window = nullptr;
};

// ---- the switch ---------------------------------------------------------------------------------

TEST_F(FrontBufferFrame, TheFirstFrameSwitchesToTheFrontBufferWithOneSwap)
{
    Start();
    Attach();

    EXPECT_TRUE(thread->Render());

    EXPECT_EQ(SurfaceCalls(),
              Names({"eglQuerySurface RENDER_BUFFER", "eglSurfaceAttrib RENDER_BUFFER SINGLE",
                     "eglQuerySurface RENDER_BUFFER", "eglSwapBuffers",
                     "eglSurfaceAttrib AUTO_REFRESH TRUE", "eglQuerySurface RENDER_BUFFER",
                     "eglQuerySurface RENDER_BUFFER", "eglQuerySurface AUTO_REFRESH"}));
    EXPECT_EQ(driver->CallCount("glFinish"), 0u);
    EXPECT_EQ(driver->CallingThreads(), 1u);
    EXPECT_EQ(OwnLines(),
              Lines({"I void Nib::GLES::RenderThreadFBRImpl::EnableFrontBuffer() enabled "
                     "EGL_SINGLE_BUFFER mode 12421",
                     "I void Nib::GLES::RenderThreadFBRImpl::EnableFrontBuffer() Front buffer mode "
                     "is [enabled] for current surface",
                     "I void Nib::GLES::RenderThreadFBRImpl::DoRender() curr "
                     "EGL_RENDER_BUFFER=12421, curr EGL_FRONT_BUFFER_AUTO_REFRESH_ANDROID=1, "
                     "EGL_BACK_BUFFER=12420, EGL_SINGLE_BUFFER=12421"}));
    EXPECT_TRUE(driver->Log().size() >= 3);
}

TEST_F(FrontBufferFrame, DrawingAppearsWithoutASwapAfterTheSwitch)
{
    Start();
    Attach(8, 8);
    thread->Render();
    driver->ForgetCalls();

    Post(thread->GetMsgQueue(),
         []
         {
             OpenGLRenderer::setClearColor(0, 1, 0, 1);
             OpenGLRenderer::clear(true, false, false);
         });
    EXPECT_TRUE(thread->Render());

    EXPECT_EQ(driver->CallCount("eglSwapBuffers"), 0u);
    EXPECT_EQ(driver->FrontPixel(window, 4, 4), (SimPixel{0, 255, 0, 255}));
}

TEST_F(FrontBufferFrame, TheSecondFrameDisablesTheScissorDropsDepthAndStencilAndFinishes)
{
    Start();
    Attach();
    thread->Render();
    driver->ForgetCalls();
    driver->ForgetLog();

    EXPECT_TRUE(thread->Render());

    EXPECT_EQ(driver->CallNames(),
              Names({"glDisable", "glGetIntegerv", "glInvalidateFramebuffer", "glFinish"}));
    EXPECT_EQ(driver->LastCall("glDisable").Arg(0), GL_SCISSOR_TEST);
    EXPECT_EQ(driver->LastCall("glInvalidateFramebuffer").list,
              (std::vector<long long>{GL_DEPTH, GL_STENCIL}));
    EXPECT_TRUE(driver->Log().empty());
}

TEST_F(FrontBufferFrame, WithoutAWindowBeforeTheSwitchDoesNothingAndStaysPending)
{
    Start();
    driver->ForgetCalls();

    EXPECT_TRUE(thread->Render());
    EXPECT_EQ(driver->CallCount(), 0u);

    Attach();
    thread->Render();
    EXPECT_EQ(driver->CallCount("eglSwapBuffers"), 1u); // the switch was still to come
}

TEST_F(FrontBufferFrame, WithoutAWindowAfterTheSwitchOnlyFinishes)
{
    Start();
    Attach();
    thread->Render();
    thread->OnSurfaceDestroyed();
    driver->ForgetCalls();

    EXPECT_TRUE(thread->Render());

    EXPECT_EQ(driver->CallNames(), Names({"glFinish"}));
}

TEST_F(FrontBufferFrame, EveryNewWindowIsSwitchedAnew)
{
    Start();
    Attach();
    thread->Render();
    thread->Render();
    driver->AllowMisuse("glFinish");
    Attach();

    thread->Render();

    EXPECT_EQ(driver->CallCount("eglSwapBuffers"), 1u);
    EXPECT_EQ(driver->CountLogContaining("enabled EGL_SINGLE_BUFFER mode 12421"), 1u);
}

TEST_F(FrontBufferFrame, ASurfaceThatIsSingleBufferedAlreadyIsLeftAlone)
{
    Start();
    Attach();
    RunOn(thread->GetMsgQueue(),
          []
          {
              eglSurfaceAttrib(eglGetCurrentDisplay(), eglGetCurrentSurface(EGL_DRAW),
                               EGL_RENDER_BUFFER, EGL_SINGLE_BUFFER);
          });
    driver->ForgetCalls();

    thread->Render();

    EXPECT_EQ(SurfaceCalls(),
              Names({"eglQuerySurface RENDER_BUFFER", "eglQuerySurface RENDER_BUFFER",
                     "eglQuerySurface AUTO_REFRESH"}));
    EXPECT_EQ(OwnLines(),
              Lines({"I void Nib::GLES::RenderThreadFBRImpl::DoRender() curr "
                     "EGL_RENDER_BUFFER=12421, curr EGL_FRONT_BUFFER_AUTO_REFRESH_ANDROID=0, "
                     "EGL_BACK_BUFFER=12420, EGL_SINGLE_BUFFER=12421"}));
}

// ---- what the display refuses -------------------------------------------------------------------

TEST_F(FrontBufferFrame, RefusedSingleBufferIsLoggedAndDrawingGoesOnUnswapped)
{
    Start();
    Attach();
    driver->FailWhen("eglSurfaceAttrib", 2, EGL_RENDER_BUFFER, EGL_BAD_MATCH);

    EXPECT_TRUE(thread->Render());

    EXPECT_EQ(SurfaceCalls(),
              Names({"eglQuerySurface RENDER_BUFFER", "eglSurfaceAttrib RENDER_BUFFER SINGLE",
                     "eglQuerySurface RENDER_BUFFER", "eglQuerySurface RENDER_BUFFER",
                     "eglQuerySurface RENDER_BUFFER", "eglQuerySurface AUTO_REFRESH"}));
    EXPECT_EQ(
        OwnLines(),
        Lines({"E void Nib::GLES::RenderThreadFBRImpl::EnableFrontBuffer() : Failed to enable "
               "EGL_SINGLE_BUFFER, err = 12297",
               "E void Nib::GLES::RenderThreadFBRImpl::EnableFrontBuffer() could not enable "
               "EGL_SINGLE_BUFFER mode 12420",
               "I void Nib::GLES::RenderThreadFBRImpl::DoRender() curr "
               "EGL_RENDER_BUFFER=12420, curr EGL_FRONT_BUFFER_AUTO_REFRESH_ANDROID=0, "
               "EGL_BACK_BUFFER=12420, EGL_SINGLE_BUFFER=12421"}));
    driver->ForgetCalls();
    EXPECT_TRUE(thread->Render());
    EXPECT_EQ(driver->CallCount("eglSwapBuffers"), 0u);
    EXPECT_EQ(driver->CallCount("glFinish"), 1u);
}

TEST_F(FrontBufferFrame, ASettingThatIsTakenButNotFollowedIsLogged)
{
    Start();
    Attach();
    // The answer to the question after the setting fails: the value stays at -1.
    int queries = 0;
    driver->OnCall("eglQuerySurface",
                   [&]
                   {
                       if (++queries == 2)
                           driver->FailNext("eglQuerySurface", EGL_BAD_SURFACE);
                   });

    EXPECT_TRUE(thread->Render());
    driver->OnCall("eglQuerySurface", {});

    EXPECT_EQ(driver->CallCount("eglSwapBuffers"), 0u);
    EXPECT_EQ(driver->CountLogContaining("Failed to enable EGL_SINGLE_BUFFER"), 0u);
    EXPECT_EQ(OwnLines().front(),
              "E void Nib::GLES::RenderThreadFBRImpl::EnableFrontBuffer() could "
              "not enable EGL_SINGLE_BUFFER mode -1");
}

TEST_F(FrontBufferFrame, ASurfaceThatBecomesSingleBufferedAllTheSameIsSwitched)
{
    Start();
    Attach();
    driver->FailWhen("eglSurfaceAttrib", 2, EGL_RENDER_BUFFER, EGL_BAD_MATCH);
    // Between the refusal and the question, the surface has changed.
    int queries = 0;
    driver->OnCall("eglQuerySurface",
                   [&]
                   {
                       if (++queries == 2)
                           eglSurfaceAttrib(eglGetCurrentDisplay(), eglGetCurrentSurface(EGL_DRAW),
                                            EGL_RENDER_BUFFER, EGL_SINGLE_BUFFER);
                   });

    EXPECT_TRUE(thread->Render());
    driver->OnCall("eglQuerySurface", {});

    EXPECT_EQ(driver->CallCount("eglSwapBuffers"), 1u);
    const std::vector<std::string> lines = OwnLines();
    ASSERT_EQ(lines.size(), 4u);
    EXPECT_EQ(lines[0], "E void Nib::GLES::RenderThreadFBRImpl::EnableFrontBuffer() : Failed to "
                        "enable EGL_SINGLE_BUFFER, err = 12297");
    EXPECT_EQ(lines[1], "I void Nib::GLES::RenderThreadFBRImpl::EnableFrontBuffer() enabled "
                        "EGL_SINGLE_BUFFER mode 12421");
}

TEST_F(FrontBufferFrame, AFailedSwapDoesNotStopTheSwitch)
{
    Start();
    Attach();
    driver->FailNext("eglSwapBuffers", EGL_BAD_SURFACE);

    EXPECT_TRUE(thread->Render());

    EXPECT_EQ(
        driver->CountLogContaining("bool Nib::EglSurface::SwapBuffers() const Failed. Err = "), 1u);
    EXPECT_EQ(driver->CallCount("eglSurfaceAttrib"), 2u);
    EXPECT_EQ(OwnLines().size(), 3u);
}

TEST_F(FrontBufferFrame, RefusedAutoRefreshIsLoggedAfterTheSwap)
{
    Start();
    Attach();
    driver->FailWhen("eglSurfaceAttrib", 2, kAutoRefresh, EGL_BAD_ATTRIBUTE);

    EXPECT_TRUE(thread->Render());

    EXPECT_EQ(driver->CallCount("eglSwapBuffers"), 1u);
    EXPECT_EQ(
        OwnLines(),
        Lines({"I void Nib::GLES::RenderThreadFBRImpl::EnableFrontBuffer() enabled "
               "EGL_SINGLE_BUFFER mode 12421",
               "E void Nib::GLES::RenderThreadFBRImpl::EnableFrontBuffer() : Failed to enable "
               "EGL_FRONT_BUFFER_AUTO_REFRESH_ANDROID to true, err = 12292",
               "I void Nib::GLES::RenderThreadFBRImpl::DoRender() curr "
               "EGL_RENDER_BUFFER=12421, curr EGL_FRONT_BUFFER_AUTO_REFRESH_ANDROID=0, "
               "EGL_BACK_BUFFER=12420, EGL_SINGLE_BUFFER=12421"}));
}

TEST_F(FrontBufferFrame, WithoutAutoRefreshOnTheDeviceTheValueIsUnknown)
{
    Start(SimGpu::Default().WithFrontBuffer().WithoutEglExtension(
        "EGL_ANDROID_front_buffer_auto_refresh"));
    Attach();

    EXPECT_TRUE(thread->Render());

    const std::vector<std::string> lines = OwnLines();
    ASSERT_EQ(lines.size(), 3u);
    EXPECT_EQ(lines[1], "E void Nib::GLES::RenderThreadFBRImpl::EnableFrontBuffer() : Failed to "
                        "enable EGL_FRONT_BUFFER_AUTO_REFRESH_ANDROID to true, err = 12292");
    EXPECT_EQ(lines[2], "I void Nib::GLES::RenderThreadFBRImpl::DoRender() curr "
                        "EGL_RENDER_BUFFER=12421, curr EGL_FRONT_BUFFER_AUTO_REFRESH_ANDROID=-1, "
                        "EGL_BACK_BUFFER=12420, EGL_SINGLE_BUFFER=12421");
}

TEST_F(FrontBufferFrame, AWindowThatCannotBeAttachedLeavesTheSwitchPending)
{
    Start();
    window = driver->Window(8, 8);
    driver->AbandonWindow(window);
    thread->OnSurfaceChanged(window, 8, 8, 0);
    driver->ForgetCalls();

    EXPECT_TRUE(thread->Render());

    EXPECT_FALSE(thread->IsAttachedToWindow());
    EXPECT_EQ(driver->CallCount(), 0u);
}

TEST_F(FrontBufferFrame, WithoutAFrontBufferConfigurationTheSwitchIsRefusedByTheWindow)
{
    System::SetDesktopFallbacks(false);
    Start(SimGpu::Default().WithoutFrontBuffer());
    driver->AllowMisuse(); // all of it without a context
    Attach();

    EXPECT_TRUE(thread->Render());
    EXPECT_TRUE(thread->Render());

    EXPECT_EQ(driver->CallCount("eglSwapBuffers"), 0u);
    EXPECT_EQ(driver->CountLogContaining("could not enable EGL_SINGLE_BUFFER mode 12420"), 1u);
}

TEST_F(FrontBufferFrame, ARefusedSwitchIsNotTriedAgainForTheSameWindow)
{
    Start();
    Attach();
    driver->FailWhen("eglSurfaceAttrib", 2, EGL_RENDER_BUFFER, EGL_BAD_MATCH);
    thread->Render();
    driver->ForgetCalls();

    thread->Render();

    EXPECT_EQ(driver->CallCount("eglSurfaceAttrib"), 0u);
}

TEST_F(FrontBufferFrame, TheWindowKeepsItsSwitchThroughAPause)
{
    driver.emplace(SimGpu::Default().WithFrontBuffer());
    std::unique_ptr<RenderThreadGL> parent(
        GLES::CreateSurfaceRenderer("parent", RenderThreadGL::Medium));
    parent->Start();
    thread = std::make_unique<GLES::RenderThreadFBRImpl>(parent->GetMsgQueue(), "front");
    thread->Start();
    ASSERT_TRUE(thread->GetMsgQueue()->waitForCompleting());
    Attach();
    thread->Render();
    thread->OnPause();
    thread->OnResume();
    ASSERT_TRUE(thread->GetMsgQueue()->waitForCompleting());
    driver->ForgetCalls();

    thread->Render();

    EXPECT_EQ(driver->CallCount("eglSwapBuffers"), 0u);
    EXPECT_EQ(driver->CallCount("glFinish"), 1u);
    thread.reset();
}

TEST_F(FrontBufferFrame, RenderIsBehindTheQueuedTasks)
{
    Start();
    Attach();
    std::atomic<int> ran{0};
    for (int i = 0; i < 10; ++i)
        Post(thread->GetMsgQueue(), [&] { ++ran; });

    thread->Render();

    EXPECT_EQ(ran, 10);
}

// ---- scissor boxes ------------------------------------------------------------------------------

TEST_F(FrontBufferFrame, ApplyUpdateRectLimitsDrawingToTheRectangle)
{
    Start();
    Attach(1920, 1080);

    thread->ApplyUpdateRect(RectF(10, 20, 110, 70), 3);
    ASSERT_TRUE(thread->GetMsgQueue()->waitForCompleting());

    EXPECT_EQ(driver->Calls(),
              Sequence({Call("glBindFramebuffer", GL_FRAMEBUFFER, 0),
                        Call("glEnable", GL_SCISSOR_TEST), Call("glScissor", 10, 1010, 100, 50)}));
    EXPECT_NE(driver->LastCall("glScissor").thread, SimDriver::ThisThread());
}

TEST_F(FrontBufferFrame, ApplyUpdateRectCopiesAndDoesNotWait)
{
    Start();
    Attach(1920, 1080);
    Gate gate(thread->GetMsgQueue());
    RectF rect(10, 20, 110, 70);

    thread->ApplyUpdateRect(rect, 0);
    rect = RectF(0, 0, 1, 1);
    gate.Open();
    ASSERT_TRUE(thread->GetMsgQueue()->waitForCompleting());

    EXPECT_EQ(driver->LastCall("glScissor"), Call("glScissor", 10, 1010, 100, 50));
}

TEST_F(FrontBufferFrame, ApplyUpdateRectClipsToTheScreen)
{
    Start();
    Attach(1920, 1080);

    thread->ApplyUpdateRect(RectF(-50, -60, 100, 200), 0);
    ASSERT_TRUE(thread->GetMsgQueue()->waitForCompleting());

    EXPECT_EQ(driver->LastCall("glScissor"), Call("glScissor", 0, 880, 100, 200));
}

TEST_F(FrontBufferFrame, ApplyUpdateRectOutsideTheScreenLetsNothingBeDrawn)
{
    Start();
    Attach(1920, 1080);

    thread->ApplyUpdateRect(RectF(2000, 20, 2100, 70), 0);
    ASSERT_TRUE(thread->GetMsgQueue()->waitForCompleting());

    EXPECT_EQ(driver->CallNames(), Names({"glBindFramebuffer", "glEnable", "glScissor"}));
    EXPECT_EQ(driver->LastCall("glScissor"), Call("glScissor", 0, 0, 0, 0));
}

TEST_F(FrontBufferFrame, ApplyUpdateRectOfAnEmptyRectangleLetsNothingBeDrawn)
{
    Start();
    Attach(1920, 1080);

    thread->ApplyUpdateRect(RectF(50, 50, 50, 60), 0);
    ASSERT_TRUE(thread->GetMsgQueue()->waitForCompleting());

    EXPECT_EQ(driver->LastCall("glScissor"), Call("glScissor", 0, 0, 0, 0));
}

TEST_F(FrontBufferFrame, ApplyUpdateRectTruncatesTowardZero)
{
    Start();
    Attach(1920, 1080);

    thread->ApplyUpdateRect(RectF(10.9f, 20.25f, 110.5f, 70.75f), 0);
    ASSERT_TRUE(thread->GetMsgQueue()->waitForCompleting());

    // x 10.9, y 1080 - 70.75 = 1009.25, width 99.6, height 50.5
    EXPECT_EQ(driver->LastCall("glScissor"), Call("glScissor", 10, 1009, 99, 50));
}

TEST_F(FrontBufferFrame, TheScissorStaysUntilTheNextFrameEnds)
{
    Start();
    Attach(1920, 1080);
    thread->Render();
    thread->ApplyUpdateRect(RectF(10, 20, 110, 70), 0);
    const auto scissorOn = [] { return glIsEnabled(GL_SCISSOR_TEST) == GL_TRUE; };
    EXPECT_TRUE(AskOn(thread->GetMsgQueue(), scissorOn));

    thread->Render();

    EXPECT_FALSE(AskOn(thread->GetMsgQueue(), scissorOn));
}

struct Box
{
    int x = -7;
    int y = -7;
    int width = -7;
    int height = -7;
};

TEST_F(FrontBufferFrame, GetScissorRectFlipsTheRectangleUnclipped)
{
    Start();
    Attach(1920, 1080);
    Box box;

    EXPECT_FALSE(
        thread->GetScissorRect(RectF(-10, 20, 3000, 70), &box.x, &box.y, &box.width, &box.height));

    EXPECT_EQ(box.x, -10);
    EXPECT_EQ(box.y, 1010);
    EXPECT_EQ(box.width, 3010);
    EXPECT_EQ(box.height, 50);
}

TEST_F(FrontBufferFrame, GetScissorRectTruncatesTowardZero)
{
    Start();
    Attach(1920, 1080);
    Box box;

    EXPECT_FALSE(thread->GetScissorRect(RectF(-10.9f, 20, 110.5f, 1080.75f), &box.x, &box.y,
                                        &box.width, &box.height));

    EXPECT_EQ(box.x, -10);
    EXPECT_EQ(box.y, 0); // -0.75
    EXPECT_EQ(box.width, 121);
    EXPECT_EQ(box.height, 1060);
}

TEST_F(FrontBufferFrame, GetScissorRectOfAnEmptyRectangleIsTrueAndZero)
{
    Start();
    Attach(1920, 1080);
    Box box;

    EXPECT_TRUE(thread->GetScissorRect(RectF(5, 5, 5, 9), &box.x, &box.y, &box.width, &box.height));

    EXPECT_EQ(box.x, 0);
    EXPECT_EQ(box.y, 0);
    EXPECT_EQ(box.width, 0);
    EXPECT_EQ(box.height, 0);
}

TEST_F(FrontBufferFrame, GetScissorRectBeforeTheFirstWindowCountsFromZero)
{
    Start();
    Box box;

    EXPECT_FALSE(
        thread->GetScissorRect(RectF(1, 2, 11, 22), &box.x, &box.y, &box.width, &box.height));

    EXPECT_EQ(box.y, -22);
    EXPECT_EQ(box.height, 20);
}

TEST_F(FrontBufferFrame, GetScissorRectMayBeCalledWhileTheThreadChangesTheSurface)
{
    Start();
    std::atomic<bool> done{false};
    std::thread asker(
        [&]
        {
            while (!done)
            {
                Box box;
                thread->GetScissorRect(RectF(0, 0, 10, 10), &box.x, &box.y, &box.width,
                                       &box.height);
                EXPECT_TRUE(box.y == -10 || box.y == 90 || box.y == 190);
            }
        });
    driver->AllowMisuse("glFinish");
    for (int i = 0; i < 50; ++i)
        thread->OnSurfaceChanged(driver->Window(100, 100), 100, i % 2 ? 100 : 200, 0);
    done = true;
    asker.join();
}

} // namespace
