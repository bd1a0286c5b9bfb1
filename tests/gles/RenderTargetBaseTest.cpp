#include "gles/RenderTargetBase.h"

#include "gles/GlContext.h"

#include <gtest/gtest.h>

#include <memory>

using namespace Nib;
using GLES::RenderTargetBase;
using Type = RenderTargetBase::FramebufferType;

namespace
{

/// A complete framebuffer of the test's own, bound, with a texture of 8 x 4 pixels.
struct OwnFramebuffer
{
    OwnFramebuffer()
    {
        glGenTextures(1, &texture);
        glBindTexture(GL_TEXTURE_2D, texture);
        glTexImage2D(GL_TEXTURE_2D, 0, GL_RGBA8, 8, 4, 0, GL_RGBA, GL_UNSIGNED_BYTE, nullptr);
        glGenFramebuffers(1, &name);
        glBindFramebuffer(GL_FRAMEBUFFER, name);
        glFramebufferTexture2D(GL_FRAMEBUFFER, GL_COLOR_ATTACHMENT0, GL_TEXTURE_2D, texture, 0);
    }
    ~OwnFramebuffer()
    {
        glDeleteFramebuffers(1, &name);
        glDeleteTextures(1, &texture);
    }

    GLuint texture = 0;
    GLuint name = 0;
};

GLint Current(GLenum name)
{
    GLint value = -1;
    glGetIntegerv(name, &value);
    return value;
}

} // namespace

TEST(RenderTargetBase, OfTypeDefaultIsFramebufferZero)
{
    GlContext gl;
    OwnFramebuffer own;
    gl.Forget();

    RenderTargetBase target(320, 240, static_cast<Type>(0));
    EXPECT_EQ(gl.driver.CallCount(), 0u);
    target.Activate();

    EXPECT_EQ(target.GetFbo(), 0u);
    EXPECT_EQ(gl.Issued(), Sequence({Call("glBindFramebuffer", GL_FRAMEBUFFER, 0),
                                     Call("glViewport", 0, 0, 320, 240)}));
}

TEST(RenderTargetBase, OfTypeCurrentIsTheFramebufferBoundWhenItWasMade)
{
    GlContext gl;
    OwnFramebuffer own;
    gl.Forget();
    RenderTargetBase target(8, 4, static_cast<Type>(1));
    EXPECT_EQ(gl.Issued(), Sequence({Call("glGetIntegerv", GL_FRAMEBUFFER_BINDING, kAddress)}));
    EXPECT_EQ(target.GetFbo(), own.name);
    OwnFramebuffer other;
    gl.Forget();

    target.Activate();

    EXPECT_EQ(gl.Issued(), Sequence({Call("glBindFramebuffer", GL_FRAMEBUFFER, own.name),
                                     Call("glViewport", 0, 0, 8, 4)}));
}

TEST(RenderTargetBase, OfAnyOtherTypeHasNoFramebufferUntilItIsSet)
{
    GlContext gl;

    for (const int type : {2, 3, -1, 100})
    {
        RenderTargetBase target(8, 4, static_cast<Type>(type));
        EXPECT_EQ(static_cast<int>(target.GetFbo()), -1) << type;
    }
    EXPECT_EQ(gl.driver.CallCount(), 0u);
}

TEST(RenderTargetBase, SetFboReplacesFramebufferAndSize)
{
    GlContext gl;
    OwnFramebuffer own;
    RenderTargetBase target(1, 1, static_cast<Type>(2));
    gl.Forget();

    target.SetFbo(30, 20, own.name);
    EXPECT_EQ(gl.driver.CallCount(), 0u);
    target.Activate();

    EXPECT_EQ(target.GetFbo(), own.name);
    EXPECT_EQ(gl.Issued(), Sequence({Call("glBindFramebuffer", GL_FRAMEBUFFER, own.name),
                                     Call("glViewport", 0, 0, 30, 20)}));
}

TEST(RenderTargetBase, DeactivateInvalidatesNothingWithAnEmptyList)
{
    GlContext gl;
    RenderTargetBase target(8, 4, Type::Default);

    target.Deactivate(false, false);

    EXPECT_EQ(gl.Issued(),
              Sequence({Call("glGetIntegerv", GL_FRAMEBUFFER_BINDING, kAddress),
                        Call("glInvalidateFramebuffer", GL_FRAMEBUFFER, 0, kAddress)}));
}

struct DiscardRow
{
    bool depth;
    bool stencil;
    std::vector<long long> ofDefault;
    std::vector<long long> ofObject;
};

TEST(RenderTargetBase, DeactivateNamesTheBuffersOfTheBoundFramebuffer)
{
    const DiscardRow rows[] = {
        {false, false, {}, {}},
        {true, false, {GL_DEPTH}, {GL_DEPTH_ATTACHMENT}},
        {false, true, {GL_STENCIL}, {GL_STENCIL_ATTACHMENT}},
        {true, true, {GL_DEPTH, GL_STENCIL}, {GL_DEPTH_ATTACHMENT, GL_STENCIL_ATTACHMENT}},
    };
    GlContext gl;
    RenderTargetBase target(8, 4, Type::Default);
    for (const DiscardRow& row : rows)
    {
        target.Deactivate(row.depth, row.stencil);
        EXPECT_EQ(gl.driver.LastCall("glInvalidateFramebuffer").list, row.ofDefault);
        EXPECT_EQ(gl.driver.LastCall("glInvalidateFramebuffer").Arg(1),
                  static_cast<long long>(row.ofDefault.size()));
    }

    // What counts is the framebuffer bound at the time, not the target's own.
    OwnFramebuffer own;
    for (const DiscardRow& row : rows)
    {
        target.Deactivate(row.depth, row.stencil);
        EXPECT_EQ(gl.driver.LastCall("glInvalidateFramebuffer").list, row.ofObject);
        EXPECT_EQ(gl.driver.LastCall("glInvalidateFramebuffer").Arg(1),
                  static_cast<long long>(row.ofObject.size()));
    }
}

TEST(RenderTargetBase, DeactivateLeavesTheFramebufferBound)
{
    GlContext gl;
    OwnFramebuffer own;
    RenderTargetBase target(8, 4, Type::Current);

    target.Deactivate(true, true);

    EXPECT_EQ(Current(GL_FRAMEBUFFER_BINDING), static_cast<GLint>(own.name));
}

TEST(RenderTargetBase, ClearColorActivatesClearsAndKeepsTheContents)
{
    GlContext gl;
    OwnFramebuffer own;
    RenderTargetBase target(8, 4, Type::Current);
    gl.Forget();

    target.ClearColor(0.25f, 0.5f, 0.75f, 1.0f);

    EXPECT_EQ(gl.Issued(),
              Sequence({Call("glBindFramebuffer", GL_FRAMEBUFFER, own.name),
                        Call("glViewport", 0, 0, 8, 4), Call("glClearColor", 0.25, 0.5, 0.75, 1.0),
                        Call("glClear", GL_COLOR_BUFFER_BIT),
                        Call("glGetIntegerv", GL_FRAMEBUFFER_BINDING, kAddress),
                        Call("glInvalidateFramebuffer", GL_FRAMEBUFFER, 0, kAddress)}));
}

TEST(RenderTargetBase, ReadPixelsFinishesReadsAndPutsThePackLayoutBack)
{
    GlContext gl;
    OwnFramebuffer own;
    RenderTargetBase target(8, 4, Type::Current);
    glPixelStorei(GL_PACK_ROW_LENGTH, 11);
    glPixelStorei(GL_PACK_SKIP_ROWS, 12);
    glPixelStorei(GL_PACK_SKIP_PIXELS, 13);
    std::vector<unsigned char> pixels(6 * 4 * 4);
    gl.Forget();

    target.ReadPixels(1, 2, 3, 2, {pixels.data(), 5, 1, 2});

    EXPECT_EQ(gl.Issued(),
              Sequence({Call("glFinish"), Call("glBindFramebuffer", GL_FRAMEBUFFER, own.name),
                        Call("glViewport", 0, 0, 8, 4),
                        Call("glGetIntegerv", GL_PACK_ROW_LENGTH, kAddress),
                        Call("glGetIntegerv", GL_PACK_SKIP_ROWS, kAddress),
                        Call("glGetIntegerv", GL_PACK_SKIP_PIXELS, kAddress),
                        Call("glPixelStorei", GL_PACK_ROW_LENGTH, 5),
                        Call("glPixelStorei", GL_PACK_SKIP_ROWS, 1),
                        Call("glPixelStorei", GL_PACK_SKIP_PIXELS, 2),
                        Call("glReadPixels", 1, 2, 3, 2, GL_RGBA, GL_UNSIGNED_BYTE, kAddress),
                        Call("glPixelStorei", GL_PACK_ROW_LENGTH, 11),
                        Call("glPixelStorei", GL_PACK_SKIP_ROWS, 12),
                        Call("glPixelStorei", GL_PACK_SKIP_PIXELS, 13),
                        Call("glGetIntegerv", GL_FRAMEBUFFER_BINDING, kAddress),
                        Call("glInvalidateFramebuffer", GL_FRAMEBUFFER, 2, kAddress)}));
    EXPECT_EQ(gl.driver.LastCall("glReadPixels").args[6],
              SimValue(static_cast<const void*>(pixels.data())));
    EXPECT_EQ(gl.driver.LastCall("glInvalidateFramebuffer").list,
              (std::vector<long long>{GL_DEPTH_ATTACHMENT, GL_STENCIL_ATTACHMENT}));
    EXPECT_EQ(Current(GL_PACK_ROW_LENGTH), 11);
    EXPECT_EQ(Current(GL_PACK_SKIP_ROWS), 12);
    EXPECT_EQ(Current(GL_PACK_SKIP_PIXELS), 13);
}

TEST(RenderTargetBase, ReadPixelsFillsOnlyTheDescribedPartOfMemory)
{
    GlContext gl;
    OwnFramebuffer own;
    RenderTargetBase target(8, 4, Type::Current);
    target.ClearColor(1.0f, 0.0f, 0.0f, 1.0f);
    std::vector<unsigned char> pixels(4 * 3 * 4, 0x55);

    // 2 x 2 pixels into a picture of rows of 4, behind one row and one pixel.
    target.ReadPixels(0, 0, 2, 2, {pixels.data(), 4, 1, 1});

    for (int y = 0; y < 3; ++y)
    {
        for (int x = 0; x < 4; ++x)
        {
            const bool inside = y >= 1 && x >= 1 && x <= 2;
            const unsigned char* const pixel = &pixels[static_cast<std::size_t>(y * 4 + x) * 4];
            EXPECT_EQ(pixel[0], inside ? 0xFF : 0x55) << x << ", " << y;
            EXPECT_EQ(pixel[1], inside ? 0x00 : 0x55) << x << ", " << y;
            EXPECT_EQ(pixel[3], inside ? 0xFF : 0x55) << x << ", " << y;
        }
    }
}

TEST(RenderTargetBase, ReleaseDeletesTheObjectAndNoGLName)
{
    GlContext gl;
    OwnFramebuffer own;
    auto* target = new RenderTargetBase(8, 4, Type::Current);
    gl.Forget();

    target->Release();

    EXPECT_EQ(gl.driver.CallCount(), 0u);
    EXPECT_TRUE(gl.driver.Framebuffer(own.name).exists);
}
