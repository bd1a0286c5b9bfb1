// Offscreen render threads on the process's driver: what they share with their parent, and what
// comes back after a pause.

#include "drivers/Driver.h"
#include "drivers/RenderThreadSupport.h"

#include <nib/device.h>
#include <nib/egl.h>
#include <nib/render_thread.h>

#include <EGL/egl.h>
#include <GLES3/gl3.h>

#include <gtest/gtest.h>

#include <memory>

using namespace Nib;

namespace
{

/// A texture with a framebuffer of its own, in the context of whoever makes it.
GLuint NewTexture(const Rgba& color)
{
    GLuint texture = 0;
    glGenTextures(1, &texture);
    glBindTexture(GL_TEXTURE_2D, texture);
    glTexParameteri(GL_TEXTURE_2D, GL_TEXTURE_MIN_FILTER, GL_NEAREST);
    glTexImage2D(GL_TEXTURE_2D, 0, GL_RGBA, 1, 1, 0, GL_RGBA, GL_UNSIGNED_BYTE, color.data());
    glBindTexture(GL_TEXTURE_2D, 0);
    glFinish();
    return texture;
}

template <typename Function>
void WithFramebuffer(GLuint texture, Function function)
{
    GLuint framebuffer = 0;
    glGenFramebuffers(1, &framebuffer);
    glBindFramebuffer(GL_FRAMEBUFFER, framebuffer);
    glFramebufferTexture2D(GL_FRAMEBUFFER, GL_COLOR_ATTACHMENT0, GL_TEXTURE_2D, texture, 0);
    EXPECT_EQ(glCheckFramebufferStatus(GL_FRAMEBUFFER), GLenum{GL_FRAMEBUFFER_COMPLETE});
    function();
    glBindFramebuffer(GL_FRAMEBUFFER, 0);
    glDeleteFramebuffers(1, &framebuffer);
    glFinish();
}

Rgba ReadTexture(GLuint texture)
{
    Rgba pixel{};
    WithFramebuffer(texture,
                    [&] { glReadPixels(0, 0, 1, 1, GL_RGBA, GL_UNSIGNED_BYTE, pixel.data()); });
    return pixel;
}

void FillTexture(GLuint texture, float r, float g, float b)
{
    WithFramebuffer(texture,
                    [=]
                    {
                        OpenGLRenderer::setClearColor(r, g, b, 1.0f);
                        OpenGLRenderer::clear(true, false, false);
                    });
}

class OffscreenThreadOnDriver : public testing::Test
{
protected:
    void SetUp() override
    {
        if (!HasPbuffers())
            GTEST_SKIP() << kNoPbuffers;
        ASSERT_EQ(Egl::GetEglStatus(), 0) << "the driver does not start";
        parent.reset(GLES::CreateSurfaceRenderer("parent", RenderThreadGL::Medium));
        ASSERT_TRUE(parent->Start());
        child.reset(GLES::CreateOffscreenRenderer(parent->GetMsgQueue(), "child", true));
        ASSERT_TRUE(child->Start());
        ASSERT_TRUE(child->GetMsgQueue()->waitForCompleting());
    }

    void TearDown() override
    {
        for (RenderThreadGL* thread : {parent.get(), child.get()})
        {
            if (thread == nullptr)
                continue;
            RunOn(thread->GetMsgQueue(),
                  []
                  {
                      EXPECT_NE(eglGetCurrentContext(), EGL_NO_CONTEXT);
                      EXPECT_EQ(glGetError(), GLenum{GL_NO_ERROR});
                  });
        }
        child.reset();
        parent.reset();
    }

    IGLMsgQueue* Parent() { return parent->GetMsgQueue(); }
    IGLMsgQueue* Child() { return child->GetMsgQueue(); }

    std::unique_ptr<RenderThreadGL> parent;
    std::unique_ptr<RenderThreadGL> child;
};

TEST_F(OffscreenThreadOnDriver, SeesTheTexturesOfItsParent)
{
    GLuint texture = 0;
    RunOn(Parent(), [&] { texture = NewTexture({10, 20, 30, 255}); });

    Rgba pixel{};
    RunOn(Child(), [&] { pixel = ReadTexture(texture); });

    EXPECT_EQ(pixel, (Rgba{10, 20, 30, 255}));
    RunOn(Parent(), [&] { glDeleteTextures(1, &texture); });
}

TEST_F(OffscreenThreadOnDriver, ItsParentSeesWhatItDraws)
{
    GLuint texture = 0;
    RunOn(Parent(), [&] { texture = NewTexture({0, 0, 0, 0}); });

    RunOn(Child(), [&] { FillTexture(texture, 1.0f, 0.0f, 1.0f); });

    Rgba pixel{};
    RunOn(Parent(), [&] { pixel = ReadTexture(texture); });
    EXPECT_EQ(pixel, (Rgba{255, 0, 255, 255}));
    RunOn(Parent(), [&] { glDeleteTextures(1, &texture); });
}

TEST_F(OffscreenThreadOnDriver, SharesAgainAfterAPause)
{
    GLuint texture = 0;
    RunOn(Parent(), [&] { texture = NewTexture({1, 2, 3, 255}); });

    for (int round = 0; round < 5; ++round)
    {
        child->OnPause();
        EXPECT_FALSE(child->Render());
        child->OnResume();
        ASSERT_TRUE(Child()->waitForCompleting());
        RunOn(Child(), [&] { FillTexture(texture, 0.0f, 1.0f, 0.0f); });
    }

    Rgba pixel{};
    RunOn(Parent(), [&] { pixel = ReadTexture(texture); });
    EXPECT_EQ(pixel, (Rgba{0, 255, 0, 255}));
    RunOn(Child(), [&] { glDeleteTextures(1, &texture); });
}

TEST_F(OffscreenThreadOnDriver, SharesWithEverySurfaceThread)
{
    std::unique_ptr<RenderThreadGL> other(
        GLES::CreateSurfaceRenderer("other", RenderThreadGL::High));
    ASSERT_TRUE(other->Start());
    GLuint texture = 0;
    RunOn(Child(), [&] { texture = NewTexture({9, 8, 7, 255}); });

    Rgba pixel{};
    RunOn(other->GetMsgQueue(), [&] { pixel = ReadTexture(texture); });

    EXPECT_EQ(pixel, (Rgba{9, 8, 7, 255}));
    RunOn(Child(), [&] { glDeleteTextures(1, &texture); });
}

TEST_F(OffscreenThreadOnDriver, WithoutAParentSharesNothing)
{
    std::unique_ptr<RenderThreadGL> alone(GLES::CreateOffscreenRenderer(nullptr, "alone", true));
    ASSERT_TRUE(alone->Start());
    GLuint texture = 0;
    RunOn(Parent(), [&] { texture = NewTexture({1, 2, 3, 255}); });

    bool known = true;
    RunOn(alone->GetMsgQueue(), [&] { known = glIsTexture(texture) == GL_TRUE; });

    EXPECT_FALSE(known);
    RunOn(Parent(), [&] { glDeleteTextures(1, &texture); });
}

// ---- the UI's own render thread -----------------------------------------------------------------

TEST_F(OffscreenThreadOnDriver, AnHwuiThreadDrawsInTheContextThatItFinds)
{
    // The child's thread plays the UI: its context is the UI's.
    HwuiCallback callback{nullptr, nullptr, nullptr};
    std::unique_ptr<RenderThreadHWUI> hwui(GLES::CreateHWUIRenderer(&callback, "hwui"));
    GLuint texture = 0;
    RunOn(Child(), [&] { texture = NewTexture({0, 0, 0, 0}); });
    hwui->GetMsgQueue()->enQueueMsg(new CallTask([&] { FillTexture(texture, 0.0f, 0.0f, 1.0f); }));

    Rgba pixel{};
    RunOn(Child(),
          [&]
          {
              EXPECT_TRUE(hwui->Render());
              pixel = ReadTexture(texture);
              glDeleteTextures(1, &texture);
              hwui.reset();
              AttachToThread(child->GetMsgQueue());
          });

    EXPECT_EQ(pixel, (Rgba{0, 0, 255, 255}));
}

} // namespace
