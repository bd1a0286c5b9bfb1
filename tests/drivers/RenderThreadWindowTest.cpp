// Render threads and a window of the X server: what they present is what the server shows.

#include "drivers/Driver.h"
#include "drivers/RenderThreadSupport.h"
#include "drivers/XWindow.h"

#include <nib/base.h>
#include <nib/device.h>
#include <nib/render_thread.h>

#include <EGL/egl.h>
#include <GLES3/gl3.h>

#include <gtest/gtest.h>

#include <functional>
#include <memory>
#include <optional>

using namespace Nib;

namespace
{

constexpr ShownColor kOrange{255, 128, 0};
constexpr ShownColor kBlue{0, 64, 255};
constexpr ShownColor kNothing{0, 0, 0};

void Clear(const ShownColor& color)
{
    OpenGLRenderer::setClearColor(static_cast<float>(color.r) / 255.0f,
                                  static_cast<float>(color.g) / 255.0f,
                                  static_cast<float>(color.b) / 255.0f, 1.0f);
    OpenGLRenderer::clear(true, false, false);
}

class RenderThreadOnX : public testing::Test
{
protected:
    void SetUp() override
    {
        if (!HasXServer())
            GTEST_SKIP() << "there is no X server";
        window.emplace(64, 48);
        thread.reset(GLES::CreateSurfaceRenderer("window", RenderThreadGL::Medium));
        ASSERT_TRUE(thread->Start());
        thread->OnSurfaceChanged(window->Native(), 64, 48, 0);
        ASSERT_TRUE(thread->IsAttachedToWindow());
    }

    void Post(std::function<void()> function)
    {
        thread->GetMsgQueue()->enQueueMsg(new CallTask(std::move(function)));
    }

    /// A frame; twice, where one that is only a clear is shown with the next.
    void Present(const std::function<void()>& function)
    {
        const int times = DriverIs({"softpipe"}) ? 2 : 1;
        for (int i = 0; i < times; ++i)
        {
            Post(function);
            EXPECT_TRUE(thread->Render());
        }
    }

    static void ExpectShown(const XWindow& shown, int x, int y, const ShownColor& expected)
    {
        const ShownColor color = shown.AtOnceNear(x, y, expected);
        EXPECT_TRUE(Near(color, expected))
            << "at " << x << ", " << y << ": " << color.r << " " << color.g << " " << color.b;
    }

    std::optional<XWindow> window; // goes after the thread
    std::unique_ptr<RenderThreadGL> thread;
};

TEST_F(RenderThreadOnX, ShowsAClear)
{
    Present([] { Clear(kOrange); });

    ExpectShown(*window, 0, 0, kOrange);
    ExpectShown(*window, 63, 47, kOrange);
}

TEST_F(RenderThreadOnX, ShowsNothingBeforeRender)
{
    Post([] { Clear(kOrange); });
    EXPECT_TRUE(thread->GetMsgQueue()->waitForCompleting());

    EXPECT_TRUE(Near(window->At(10, 10), kNothing));
}

TEST_F(RenderThreadOnX, ShowsTheFramesOneAfterTheOther)
{
    for (int frame = 0; frame < 10; ++frame)
    {
        const ShownColor color = frame % 2 == 0 ? kOrange : kBlue;
        thread->ApplyUpdateRect(RectF(0, 0, 64, 48), 0);
        Present([color] { Clear(color); });
        ExpectShown(*window, 32, 24, color);
    }
}

TEST_F(RenderThreadOnX, ShowsGLsRowsFromTheBottomUp)
{
    Present(
        []
        {
            Clear(kOrange);
            OpenGLRenderer::enableState(RenderState::ScissorTest);
            OpenGLRenderer::setScissor(0, 0, 64, 24); // the lower half
            Clear(kBlue);
            OpenGLRenderer::disableState(RenderState::ScissorTest);
        });

    ExpectShown(*window, 5, 40, kBlue);
    ExpectShown(*window, 5, 5, kOrange);
}

TEST_F(RenderThreadOnX, MovesToAnotherWindow)
{
    Present([] { Clear(kOrange); });
    ExpectShown(*window, 5, 5, kOrange);
    XWindow second(32, 32);

    thread->OnSurfaceChanged(second.Native(), 32, 32, 0);
    Present([] { Clear(kBlue); });

    ExpectShown(second, 5, 5, kBlue);
    thread.reset();
}

TEST_F(RenderThreadOnX, FollowsAChangeOfSize)
{
    window->Resize(200, 100);

    thread->OnSurfaceChanged(window->Native(), 200, 100, 0);
    Present(
        []
        {
            OpenGLRenderer::setViewport(0, 0, 200, 100);
            Clear(kBlue);
        });

    ExpectShown(*window, 199, 99, kBlue);
}

TEST_F(RenderThreadOnX, DrawsOnWithoutItsWindowAndComesBack)
{
    thread->OnSurfaceDestroyed();
    EXPECT_FALSE(thread->IsAttachedToWindow());
    bool current = false;
    RunOn(thread->GetMsgQueue(), [&] { current = eglGetCurrentContext() != EGL_NO_CONTEXT; });
    EXPECT_TRUE(current);
    EXPECT_TRUE(thread->Render());

    thread->OnSurfaceChanged(window->Native(), 64, 48, 0);
    Present([] { Clear(kOrange); });

    ExpectShown(*window, 20, 20, kOrange);
}

TEST_F(RenderThreadOnX, AFrontBufferThreadWorksThoughTheDriverHasNoFrontBuffer)
{
    std::unique_ptr<RenderThreadGL> front(
        GLES::CreateFBRSurfaceRenderer(thread->GetMsgQueue(), "front"));
    ASSERT_TRUE(front->Start());
    ASSERT_TRUE(front->GetMsgQueue()->waitForCompleting());
    XWindow second(32, 32);
    front->OnSurfaceChanged(second.Native(), 32, 32, 0);
    EXPECT_TRUE(front->IsAttachedToWindow());

    Rgba pixel{};
    EXPECT_TRUE(front->Render());
    front->ApplyUpdateRect(RectF(0, 0, 16, 32), 0);
    RunOn(front->GetMsgQueue(),
          [&]
          {
              Clear(kOrange);
              glReadPixels(4, 4, 1, 1, GL_RGBA, GL_UNSIGNED_BYTE, pixel.data());
          });
    EXPECT_TRUE(front->Render());

    EXPECT_EQ(pixel[0], 255);
    EXPECT_EQ(pixel[2], 0);
    EXPECT_FALSE(IsFBRSupported());
    front->OnSurfaceDestroyed();
    front.reset();
}

} // namespace
