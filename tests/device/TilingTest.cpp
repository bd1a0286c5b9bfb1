#include "Device.h"

#include <nib/device.h>

#include <gtest/gtest.h>

#include <vector>

using Nib::OpenGLRenderer;

namespace
{

SimGpu TiledPhone()
{
    return SimGpu::Named("Adreno (TM) 330");
}

} // namespace

// ---- GL_QCOM_tiled_rendering --------------------------------------------------------------------

TEST(Tiling, IsNotSupportedBeforeTheExtensionsAreRead)
{
    Device device(TiledPhone());

    EXPECT_FALSE(OpenGLRenderer::checkQCOMTilingSupport());
    EXPECT_FALSE(OpenGLRenderer::startTilingQCOM(1, 2, 3, 4, 1));
    OpenGLRenderer::stopTilingQCOM(1);

    EXPECT_EQ(device.driver.CallCount(), 0u);
    EXPECT_EQ(device.driver.Log().size(), 0u);
}

TEST(Tiling, IsNotSupportedWithoutTheExtension)
{
    Device device(TiledPhone().WithoutGlExtension("GL_QCOM_tiled_rendering"));
    InitOpenGLExtensions();
    device.driver.ForgetCalls();

    EXPECT_FALSE(OpenGLRenderer::checkQCOMTilingSupport());
    EXPECT_FALSE(OpenGLRenderer::startTilingQCOM(1, 2, 3, 4, 1));
    OpenGLRenderer::stopTilingQCOM(1);

    EXPECT_EQ(device.driver.CallCount(), 0u);
}

TEST(Tiling, IsNotSupportedWhereTheEntryPointsAreMissing)
{
    Device device(TiledPhone());
    device.driver.FailNext("eglGetProcAddress", EGL_SUCCESS, 2);
    InitOpenGLExtensions();

    EXPECT_FALSE(OpenGLRenderer::checkQCOMTilingSupport());
    EXPECT_FALSE(OpenGLRenderer::startTilingQCOM(1, 2, 3, 4, 1));
}

TEST(Tiling, StopDoesNothingWhereItsEntryPointAloneIsMissing)
{
    Device device(TiledPhone());
    device.driver.FailAt(5, EGL_SUCCESS); // three texts, glStartTilingQCOM, glEndTilingQCOM
    InitOpenGLExtensions();
    device.driver.ForgetCalls();

    EXPECT_TRUE(OpenGLRenderer::startTilingQCOM(1, 2, 3, 4, 0));
    OpenGLRenderer::stopTilingQCOM(1);

    EXPECT_EQ(device.driver.CallNames(), Names({"glStartTilingQCOM"}));
}

TEST(Tiling, EntryPointsAreResolvedByName)
{
    Device device(TiledPhone());

    InitOpenGLExtensions();

    EXPECT_EQ(device.driver.Calls("eglGetProcAddress"),
              Sequence({Call("eglGetProcAddress", "glStartTilingQCOM"),
                        Call("eglGetProcAddress", "glEndTilingQCOM")}));
}

TEST(Tiling, SupportIsLogged)
{
    Device device(TiledPhone());
    InitOpenGLExtensions();
    device.driver.ForgetLog();

    EXPECT_TRUE(OpenGLRenderer::checkQCOMTilingSupport());

    EXPECT_EQ(device.driver.LogTexts(ANDROID_LOG_INFO),
              std::vector<std::string>{"static bool Nib::OpenGLRenderer::checkQCOMTilingSupport() "
                                       "tiling is supported"});
}

TEST(Tiling, MaskHasABitForEachBuffer)
{
    EXPECT_EQ(OpenGLRenderer::getTilingMaskQCOM(0), 0u);
    EXPECT_EQ(OpenGLRenderer::getTilingMaskQCOM(1), 0x1u);
    EXPECT_EQ(OpenGLRenderer::getTilingMaskQCOM(2), 0x100u);
    EXPECT_EQ(OpenGLRenderer::getTilingMaskQCOM(4), 0x10000u);
    EXPECT_EQ(OpenGLRenderer::getTilingMaskQCOM(7), 0x10101u);
    EXPECT_EQ(OpenGLRenderer::getTilingMaskQCOM(6), 0x10100u);
    EXPECT_EQ(OpenGLRenderer::getTilingMaskQCOM(8), 0u);
    EXPECT_EQ(OpenGLRenderer::getTilingMaskQCOM(-1), 0x10101u);
}

TEST(Tiling, StartAndStopTranslateTheMask)
{
    Device device(TiledPhone());
    InitOpenGLExtensions();
    device.driver.ForgetCalls();

    EXPECT_TRUE(OpenGLRenderer::startTilingQCOM(1, 2, 30, 40, 3));
    OpenGLRenderer::stopTilingQCOM(5);

    EXPECT_EQ(device.driver.Calls(), Sequence({Call("glStartTilingQCOM", 1, 2, 30, 40, 0x101),
                                               Call("glEndTilingQCOM", 0x10001)}));
}

// ---- discardFramebuffer -------------------------------------------------------------------------

namespace
{

std::vector<long long> Discarded(Device& device, int mask)
{
    device.driver.ForgetCalls();
    OpenGLRenderer::discardFramebuffer(mask);
    EXPECT_EQ(device.driver.CallNames(), Names({"glGetIntegerv", "glInvalidateFramebuffer"}));
    EXPECT_EQ(device.driver.LastCall("glGetIntegerv").Arg(0), 0x8CA6); // GL_FRAMEBUFFER_BINDING
    const SimCall call = device.driver.LastCall("glInvalidateFramebuffer");
    EXPECT_EQ(call.Arg(0), 0x8D40);
    EXPECT_EQ(call.Arg(1), static_cast<long long>(call.list.size()));
    return call.list;
}

using Buffers = std::vector<long long>;

} // namespace

TEST(Tiling, DiscardNamesTheBuffersOfTheWindow)
{
    Device device;
    EXPECT_EQ(Discarded(device, 1), (Buffers{0x1800}));
    EXPECT_EQ(Discarded(device, 2), (Buffers{0x1801}));
    EXPECT_EQ(Discarded(device, 4), (Buffers{0x1802}));
    EXPECT_EQ(Discarded(device, 6), (Buffers{0x1801, 0x1802}));
    EXPECT_EQ(Discarded(device, 7), (Buffers{0x1800, 0x1801, 0x1802}));
}

TEST(Tiling, DiscardNamesTheAttachmentsOfAFramebuffer)
{
    Device device;
    GLuint framebuffer = 0;
    glGenFramebuffers(1, &framebuffer);
    glBindFramebuffer(GL_FRAMEBUFFER, framebuffer);

    EXPECT_EQ(Discarded(device, 1), (Buffers{0x8CE0}));
    EXPECT_EQ(Discarded(device, 2), (Buffers{0x8D00}));
    EXPECT_EQ(Discarded(device, 4), (Buffers{0x8D20}));
    EXPECT_EQ(Discarded(device, 5), (Buffers{0x8CE0, 0x8D20}));
    EXPECT_EQ(Discarded(device, 7), (Buffers{0x8CE0, 0x8D00, 0x8D20}));
}

TEST(Tiling, DiscardOfNothingIsACallToo)
{
    Device device;
    EXPECT_EQ(Discarded(device, 0), (Buffers{}));
    EXPECT_EQ(Discarded(device, 8), (Buffers{}));
}
