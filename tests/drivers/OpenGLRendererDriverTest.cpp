#include "DriverContext.h"

#include <nib/device.h>
#include <nib/texture.h>

#include <cstring>
#include <string>
#include <vector>

// What the library says about whatever driver the process has loaded, and its state calls there.

using Nib::BlendingFactorOld;
using Nib::BlendingFuncOld;
using Nib::DSFunc;
using Nib::FaceMode;
using Nib::FramebufferTarget;
using Nib::OpenGLRenderer;
using Nib::ReadbackBufferLayout;
using Nib::RenderState;
using Nib::StencilAction;

namespace
{

using OpenGLRendererOnDriver = DriverContext;

constexpr auto kRgba = static_cast<Nib::TextureTargetLayout>(2);
constexpr auto kRgba8 = static_cast<Nib::TextureMemoryLayout>(6);

std::string Text(GLenum name)
{
    return reinterpret_cast<const char*>(glGetString(name));
}

} // namespace

// ---- what the driver can do ---------------------------------------------------------------------

TEST_F(OpenGLRendererOnDriver, LimitIsTheSmallerOfTextureAndViewport)
{
    OpenGLRenderer::InitParameters();

    GLint viewport[2] = {};
    glGetIntegerv(GL_MAX_VIEWPORT_DIMS, viewport);
    const GLint texture = Integer(GL_MAX_TEXTURE_SIZE);
    EXPECT_GE(texture, 2048);
    EXPECT_EQ(OpenGLRenderer::getMaxTextureSize(), texture < viewport[0] ? texture : viewport[0]);
    EXPECT_TRUE(OpenGLRenderer::IsGLParameterInited());
    EXPECT_TRUE(OpenGLRenderer::isMinMaxBlendingSupported());
}

TEST_F(OpenGLRendererOnDriver, EveryListedExtensionIsSupported)
{
    GLint count = 0;
    glGetIntegerv(GL_NUM_EXTENSIONS, &count);
    ASSERT_GT(count, 0);
    for (GLint i = 0; i < count; ++i)
    {
        const auto* name =
            reinterpret_cast<const char*>(glGetStringi(GL_EXTENSIONS, static_cast<GLuint>(i)));
        EXPECT_TRUE(IsGLExtensionSupported(name)) << name;
    }
    EXPECT_FALSE(IsGLExtensionSupported("GL_NIB_no_such_extension"));
}

TEST_F(OpenGLRendererOnDriver, SamplersAreSupportedFromVersion31On)
{
    GLint major = 0;
    GLint minor = 0;
    glGetIntegerv(GL_MAJOR_VERSION, &major);
    glGetIntegerv(GL_MINOR_VERSION, &minor);

    EXPECT_EQ(OpenGLRenderer::getSupportSampler(), major * 10 + minor >= 31);
}

TEST_F(OpenGLRendererOnDriver, VendorIsThatOfItsText)
{
    const std::string vendor = Text(GL_VENDOR);
    const bool arm = vendor.find("ARM") != std::string::npos;
    const bool qualcomm = vendor.find("Qualcomm") != std::string::npos;

    EXPECT_EQ(OpenGLRenderer::getGPUVendor(), arm ? 1 : qualcomm ? 2 : 3) << vendor;
    EXPECT_TRUE(arm || OpenGLRenderer::getMaliDriverVersion() == 0);
}

TEST_F(OpenGLRendererOnDriver, GpuIsFoundByItsOwnName)
{
    const std::string renderer = Text(GL_RENDERER);
    const char* names[] = {"Nobody's", renderer.c_str(), nullptr};
    const char* others[] = {"Nobody's", "Nothing", nullptr};

    EXPECT_TRUE(OpenGLRenderer::isGpuOneOf(names));
    EXPECT_FALSE(OpenGLRenderer::isGpuOneOf(others));
    EXPECT_TRUE(Nib::IsGPUNameEqualTo(renderer.substr(0, 4).c_str()));
    EXPECT_FALSE(Nib::IsGPUNameEqualTo("Nobody's"));
}

TEST_F(OpenGLRendererOnDriver, TilingIsThereWhereTheDriverListsIt)
{
    const bool listed = IsGLExtensionSupported("GL_QCOM_tiled_rendering");
    EXPECT_TRUE(InitOpenGLExtensions());
    EXPECT_EQ(OpenGLRenderer::checkQCOMTilingSupport(), listed);
    EXPECT_EQ(OpenGLRenderer::startTilingQCOM(0, 0, 8, 8, 7), listed);
    OpenGLRenderer::stopTilingQCOM(7);
}

TEST(CompatibilityOnDriver, RunsTheRendererWithoutAFrontBuffer)
{
    if (!HasPbuffers())
        GTEST_SKIP() << kNoPbuffers;
    EXPECT_TRUE(Nib::IsCompatibleGL());
    EXPECT_FALSE(Nib::IsFBRSupported());
}

// ---- errors -------------------------------------------------------------------------------------

TEST_F(OpenGLRendererOnDriver, ErrorsAreTaken)
{
    EXPECT_TRUE(OpenGLRenderer::reportGLError("none"));
    glEnable(0xFFFF);
    EXPECT_FALSE(OpenGLRenderer::reportGLError("one"));
    EXPECT_TRUE(OpenGLRenderer::reportGLError("taken"));
    glEnable(0xFFFF);
    EXPECT_FALSE(OpenGLRenderer::reportAndResetAllGLErrors("all"));
    EXPECT_TRUE(OpenGLRenderer::reportAndResetAllGLErrors("taken"));
}

// ---- state --------------------------------------------------------------------------------------

TEST_F(OpenGLRendererOnDriver, SettersReachTheState)
{
    OpenGLRenderer::enableState(RenderState::StencilTest);
    EXPECT_EQ(glIsEnabled(GL_STENCIL_TEST), GL_TRUE);
    OpenGLRenderer::disableState(RenderState::StencilTest);
    EXPECT_EQ(glIsEnabled(GL_STENCIL_TEST), GL_FALSE);

    OpenGLRenderer::setBlendEquation(BlendingFuncOld::ReverseSubtract, BlendingFuncOld::Max);
    EXPECT_EQ(Integer(GL_BLEND_EQUATION_RGB), GL_FUNC_REVERSE_SUBTRACT);
    EXPECT_EQ(Integer(GL_BLEND_EQUATION_ALPHA), GL_MAX);

    OpenGLRenderer::setBlendFuncFactors(BlendingFactorOld::SrcAlpha, BlendingFactorOld::DstColor,
                                        BlendingFactorOld::One, BlendingFactorOld::ConstantAlpha);
    EXPECT_EQ(Integer(GL_BLEND_SRC_RGB), GL_SRC_ALPHA);
    EXPECT_EQ(Integer(GL_BLEND_DST_RGB), GL_DST_COLOR);
    EXPECT_EQ(Integer(GL_BLEND_SRC_ALPHA), GL_ONE);
    EXPECT_EQ(Integer(GL_BLEND_DST_ALPHA), GL_CONSTANT_ALPHA);

    OpenGLRenderer::setStencilFunc(FaceMode::Back, DSFunc::NotEqual, 5, 0x3Cu);
    EXPECT_EQ(Integer(GL_STENCIL_BACK_FUNC), GL_NOTEQUAL);
    EXPECT_EQ(Integer(GL_STENCIL_BACK_REF), 5);
    EXPECT_EQ(Integer(GL_STENCIL_BACK_VALUE_MASK), 0x3C);
    EXPECT_EQ(Integer(GL_STENCIL_FUNC), GL_ALWAYS);

    OpenGLRenderer::setStencilAction(FaceMode::Front, StencilAction::Replace, StencilAction::Invert,
                                     StencilAction::DecrementWrap);
    EXPECT_EQ(Integer(GL_STENCIL_FAIL), GL_REPLACE);
    EXPECT_EQ(Integer(GL_STENCIL_PASS_DEPTH_FAIL), GL_INVERT);
    EXPECT_EQ(Integer(GL_STENCIL_PASS_DEPTH_PASS), GL_DECR_WRAP);
    EXPECT_EQ(Integer(GL_STENCIL_BACK_FAIL), GL_KEEP);

    OpenGLRenderer::setStencilMask(FaceMode::Front, 0x0Fu);
    EXPECT_EQ(Integer(GL_STENCIL_WRITEMASK), 0x0F);

    OpenGLRenderer::setCullingSide(FaceMode::FrontAndBack);
    EXPECT_EQ(Integer(GL_CULL_FACE_MODE), GL_FRONT_AND_BACK);

    OpenGLRenderer::setDepthFunc(DSFunc::GreaterEqual);
    EXPECT_EQ(Integer(GL_DEPTH_FUNC), GL_GEQUAL);

    OpenGLRenderer::setWriteMask(false, false);
    EXPECT_EQ(FourIntegers(GL_COLOR_WRITEMASK), (std::array<GLint, 4>{0, 0, 0, 0}));
    EXPECT_EQ(Integer(GL_DEPTH_WRITEMASK), 0);

    OpenGLRenderer::setClearStencil(7.9f);
    EXPECT_EQ(Integer(GL_STENCIL_CLEAR_VALUE), 7);
}

TEST_F(OpenGLRendererOnDriver, ViewportIsReadBack)
{
    OpenGLRenderer::setViewport(3, 4, 20u, 10u);

    const OpenGLRenderer::Viewport viewport = OpenGLRenderer::getViewport();

    EXPECT_EQ(viewport.x, 3);
    EXPECT_EQ(viewport.y, 4);
    EXPECT_EQ(viewport.width, 20);
    EXPECT_EQ(viewport.height, 10);
}

TEST_F(OpenGLRendererOnDriver, PreviousReadbackLayoutIsReturned)
{
    int previous = -1;
    OpenGLRenderer::setReadbackBufferLayout(ReadbackBufferLayout::Alignment, 1, &previous);
    EXPECT_EQ(previous, 4);
    OpenGLRenderer::setReadbackBufferLayout(ReadbackBufferLayout::Alignment, 8, &previous);
    EXPECT_EQ(previous, 1);
    EXPECT_EQ(Integer(GL_PACK_ALIGNMENT), 8);
}

TEST_F(OpenGLRendererOnDriver, ClearedPixelsAreReadBackInsideTheScissor)
{
    OpenGLRenderer::setClearColor(1, 0, 0, 1);
    OpenGLRenderer::clear(true, true, true);
    OpenGLRenderer::enableState(RenderState::ScissorTest);
    OpenGLRenderer::setScissor(8, 8, 4u, 4u);
    OpenGLRenderer::setClearColor(0, 1, 0, 1);
    OpenGLRenderer::clear(true, false, false);
    OpenGLRenderer::disableState(RenderState::ScissorTest);
    OpenGLRenderer::clear(false, false, false); // nothing
    OpenGLRenderer::finish();

    unsigned char pixels[4 * 4 * 4] = {};
    OpenGLRenderer::readPixels(10, 10, 4, 4, pixels, kRgba, kRgba8);

    const unsigned char green[] = {0, 255, 0, 255};
    const unsigned char red[] = {255, 0, 0, 255};
    EXPECT_EQ(std::memcmp(&pixels[(0 * 4 + 0) * 4], green, 4), 0); // (10, 10)
    EXPECT_EQ(std::memcmp(&pixels[(1 * 4 + 1) * 4], green, 4), 0); // (11, 11)
    EXPECT_EQ(std::memcmp(&pixels[(2 * 4 + 1) * 4], red, 4), 0);   // (11, 12)
    EXPECT_EQ(std::memcmp(&pixels[(1 * 4 + 2) * 4], red, 4), 0);   // (12, 11)
}

TEST_F(OpenGLRendererOnDriver, DiscardIsAcceptedForWindowAndFramebuffer)
{
    for (int mask = 0; mask < 8; ++mask)
        OpenGLRenderer::discardFramebuffer(mask);
    EXPECT_EQ(glGetError(), GLenum{GL_NO_ERROR});

    GLuint texture = 0;
    GLuint framebuffer = 0;
    glGenTextures(1, &texture);
    OpenGLRenderer::activateTextureUnit2D(1, static_cast<int>(texture));
    EXPECT_EQ(Integer(GL_ACTIVE_TEXTURE), GL_TEXTURE1);
    glTexImage2D(GL_TEXTURE_2D, 0, GL_RGBA8, 4, 4, 0, GL_RGBA, GL_UNSIGNED_BYTE, nullptr);
    glGenFramebuffers(1, &framebuffer);
    OpenGLRenderer::bindFramebuffer(FramebufferTarget::ReadAndDraw, framebuffer);
    EXPECT_EQ(Integer(GL_FRAMEBUFFER_BINDING), static_cast<GLint>(framebuffer));
    glFramebufferTexture2D(GL_FRAMEBUFFER, GL_COLOR_ATTACHMENT0, GL_TEXTURE_2D, texture, 0);
    for (int mask = 0; mask < 8; ++mask)
        OpenGLRenderer::discardFramebuffer(mask);
    EXPECT_EQ(glGetError(), GLenum{GL_NO_ERROR});
}
