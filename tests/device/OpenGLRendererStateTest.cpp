#include "Device.h"

#include <nib/device.h>
#include <nib/texture.h>

#include <gtest/gtest.h>

#include <vector>

using Nib::BlendingFactorOld;
using Nib::BlendingFuncOld;
using Nib::DSFunc;
using Nib::FaceMode;
using Nib::FramebufferTarget;
using Nib::OpenGLRenderer;
using Nib::ReadbackBufferLayout;
using Nib::RenderState;
using Nib::StencilAction;

// ---- the enumerations are GL tokens -------------------------------------------------------------

TEST(OpenGLRendererState, EnumerationsHoldTokens)
{
    struct Row
    {
        int value;
        GLenum token;
    };
    const Row rows[] = {
        {static_cast<int>(RenderState::CullFace), GL_CULL_FACE},
        {static_cast<int>(RenderState::DepthTest), GL_DEPTH_TEST},
        {static_cast<int>(RenderState::StencilTest), GL_STENCIL_TEST},
        {static_cast<int>(RenderState::Dither), GL_DITHER},
        {static_cast<int>(RenderState::Blend), GL_BLEND},
        {static_cast<int>(RenderState::ScissorTest), GL_SCISSOR_TEST},
        {static_cast<int>(RenderState::PolygonOffsetFill), GL_POLYGON_OFFSET_FILL},
        {static_cast<int>(RenderState::SampleAlphaToCoverage), GL_SAMPLE_ALPHA_TO_COVERAGE},
        {static_cast<int>(RenderState::SampleCoverage), GL_SAMPLE_COVERAGE},
        {static_cast<int>(RenderState::RasterizerDiscard), GL_RASTERIZER_DISCARD},
        {static_cast<int>(RenderState::PrimitiveRestartFixedIndex),
         GL_PRIMITIVE_RESTART_FIXED_INDEX},
        {static_cast<int>(BlendingFuncOld::Add), GL_FUNC_ADD},
        {static_cast<int>(BlendingFuncOld::Min), GL_MIN},
        {static_cast<int>(BlendingFuncOld::Max), GL_MAX},
        {static_cast<int>(BlendingFuncOld::Subtract), GL_FUNC_SUBTRACT},
        {static_cast<int>(BlendingFuncOld::ReverseSubtract), GL_FUNC_REVERSE_SUBTRACT},
        {static_cast<int>(BlendingFactorOld::Zero), GL_ZERO},
        {static_cast<int>(BlendingFactorOld::One), GL_ONE},
        {static_cast<int>(BlendingFactorOld::SrcColor), GL_SRC_COLOR},
        {static_cast<int>(BlendingFactorOld::OneMinusSrcColor), GL_ONE_MINUS_SRC_COLOR},
        {static_cast<int>(BlendingFactorOld::SrcAlpha), GL_SRC_ALPHA},
        {static_cast<int>(BlendingFactorOld::OneMinusSrcAlpha), GL_ONE_MINUS_SRC_ALPHA},
        {static_cast<int>(BlendingFactorOld::DstAlpha), GL_DST_ALPHA},
        {static_cast<int>(BlendingFactorOld::OneMinusDstAlpha), GL_ONE_MINUS_DST_ALPHA},
        {static_cast<int>(BlendingFactorOld::DstColor), GL_DST_COLOR},
        {static_cast<int>(BlendingFactorOld::OneMinusDstColor), GL_ONE_MINUS_DST_COLOR},
        {static_cast<int>(BlendingFactorOld::SrcAlphaSaturate), GL_SRC_ALPHA_SATURATE},
        {static_cast<int>(BlendingFactorOld::ConstantColor), GL_CONSTANT_COLOR},
        {static_cast<int>(BlendingFactorOld::OneMinusConstantColor), GL_ONE_MINUS_CONSTANT_COLOR},
        {static_cast<int>(BlendingFactorOld::ConstantAlpha), GL_CONSTANT_ALPHA},
        {static_cast<int>(BlendingFactorOld::OneMinusConstantAlpha), GL_ONE_MINUS_CONSTANT_ALPHA},
        {static_cast<int>(FaceMode::Front), GL_FRONT},
        {static_cast<int>(FaceMode::Back), GL_BACK},
        {static_cast<int>(FaceMode::FrontAndBack), GL_FRONT_AND_BACK},
        {static_cast<int>(DSFunc::Never), GL_NEVER},
        {static_cast<int>(DSFunc::Less), GL_LESS},
        {static_cast<int>(DSFunc::Equal), GL_EQUAL},
        {static_cast<int>(DSFunc::LessEqual), GL_LEQUAL},
        {static_cast<int>(DSFunc::Greater), GL_GREATER},
        {static_cast<int>(DSFunc::NotEqual), GL_NOTEQUAL},
        {static_cast<int>(DSFunc::GreaterEqual), GL_GEQUAL},
        {static_cast<int>(DSFunc::Always), GL_ALWAYS},
        {static_cast<int>(StencilAction::Zero), GL_ZERO},
        {static_cast<int>(StencilAction::Invert), GL_INVERT},
        {static_cast<int>(StencilAction::Keep), GL_KEEP},
        {static_cast<int>(StencilAction::Replace), GL_REPLACE},
        {static_cast<int>(StencilAction::Increment), GL_INCR},
        {static_cast<int>(StencilAction::Decrement), GL_DECR},
        {static_cast<int>(StencilAction::IncrementWrap), GL_INCR_WRAP},
        {static_cast<int>(StencilAction::DecrementWrap), GL_DECR_WRAP},
        {static_cast<int>(FramebufferTarget::Read), GL_READ_FRAMEBUFFER},
        {static_cast<int>(FramebufferTarget::Draw), GL_DRAW_FRAMEBUFFER},
        {static_cast<int>(FramebufferTarget::ReadAndDraw), GL_FRAMEBUFFER},
        {static_cast<int>(ReadbackBufferLayout::RowLength), GL_PACK_ROW_LENGTH},
        {static_cast<int>(ReadbackBufferLayout::SkipRows), GL_PACK_SKIP_ROWS},
        {static_cast<int>(ReadbackBufferLayout::SkipPixels), GL_PACK_SKIP_PIXELS},
        {static_cast<int>(ReadbackBufferLayout::Alignment), GL_PACK_ALIGNMENT},
    };
    for (const Row& row : rows)
        EXPECT_EQ(static_cast<GLenum>(row.value), row.token);
}

// ---- one call each ------------------------------------------------------------------------------

TEST(OpenGLRendererState, SetClearColor)
{
    Device device;
    OpenGLRenderer::setClearColor(0.25f, 0.5f, 0.75f, 1.0f);
    EXPECT_EQ(device.driver.Calls(), Sequence({Call("glClearColor", 0.25, 0.5, 0.75, 1.0)}));
}

TEST(OpenGLRendererState, SetClearDepth)
{
    Device device;
    OpenGLRenderer::setClearDepth(0.5f);
    EXPECT_EQ(device.driver.Calls(), Sequence({Call("glClearDepthf", 0.5)}));
}

TEST(OpenGLRendererState, SetClearStencilTruncatesTowardZero)
{
    Device device;
    OpenGLRenderer::setClearStencil(3.9f);
    OpenGLRenderer::setClearStencil(-3.9f);
    OpenGLRenderer::setClearStencil(0.0f);
    EXPECT_EQ(device.driver.Calls(),
              Sequence({Call("glClearStencil", 3), Call("glClearStencil", -3),
                        Call("glClearStencil", 0)}));
}

TEST(OpenGLRendererState, ClearNamesTheBuffersOfTheTrueFlags)
{
    Device device;
    OpenGLRenderer::clear(true, false, false);
    OpenGLRenderer::clear(false, true, false);
    OpenGLRenderer::clear(false, false, true);
    OpenGLRenderer::clear(true, true, true);
    EXPECT_EQ(device.driver.Calls(), Sequence({Call("glClear", 0x4000), Call("glClear", 0x0100),
                                               Call("glClear", 0x0400), Call("glClear", 0x4500)}));
}

TEST(OpenGLRendererState, ClearOfNothingIsACallToo)
{
    Device device;
    OpenGLRenderer::clear(false, false, false);
    EXPECT_EQ(device.driver.Calls(), Sequence({Call("glClear", 0)}));
}

TEST(OpenGLRendererState, EnableAndDisableState)
{
    Device device;
    OpenGLRenderer::enableState(RenderState::ScissorTest);
    OpenGLRenderer::disableState(static_cast<RenderState>(GL_BLEND));
    EXPECT_EQ(device.driver.Calls(),
              Sequence({Call("glEnable", 0x0C11), Call("glDisable", 0x0BE2)}));
}

TEST(OpenGLRendererState, StoreAndLoadStateDoNothing)
{
    Device device;
    OpenGLRenderer::storeState(0xFFFFFFFFu);
    OpenGLRenderer::loadState(0xFFFFFFFFu);
    EXPECT_EQ(device.driver.CallCount(), 0u);
}

TEST(OpenGLRendererState, SetBlendEquation)
{
    Device device;
    OpenGLRenderer::setBlendEquation(BlendingFuncOld::Subtract, BlendingFuncOld::Max);
    EXPECT_EQ(device.driver.Calls(), Sequence({Call("glBlendEquationSeparate", 0x800A, 0x8008)}));
}

TEST(OpenGLRendererState, SetBlendFuncFactors)
{
    Device device;
    OpenGLRenderer::setBlendFuncFactors(BlendingFactorOld::SrcAlpha,
                                        BlendingFactorOld::OneMinusSrcAlpha, BlendingFactorOld::One,
                                        BlendingFactorOld::Zero);
    EXPECT_EQ(device.driver.Calls(), Sequence({Call("glBlendFuncSeparate", 0x0302, 0x0303, 1, 0)}));
}

TEST(OpenGLRendererState, SetStencilFunc)
{
    Device device;
    OpenGLRenderer::setStencilFunc(FaceMode::Back, DSFunc::GreaterEqual, -5, 0xF0u);
    EXPECT_EQ(device.driver.Calls(),
              Sequence({Call("glStencilFuncSeparate", 0x0405, 0x0206, -5, 0xF0)}));
}

TEST(OpenGLRendererState, SetStencilAction)
{
    Device device;
    OpenGLRenderer::setStencilAction(FaceMode::Front, StencilAction::Keep, StencilAction::Replace,
                                     StencilAction::IncrementWrap);
    EXPECT_EQ(device.driver.Calls(),
              Sequence({Call("glStencilOpSeparate", 0x0404, 0x1E00, 0x1E01, 0x8507)}));
}

TEST(OpenGLRendererState, SetStencilMask)
{
    Device device;
    OpenGLRenderer::setStencilMask(FaceMode::FrontAndBack, 0x0Fu);
    EXPECT_EQ(device.driver.Calls(), Sequence({Call("glStencilMaskSeparate", 0x0408, 0x0F)}));
}

TEST(OpenGLRendererState, SetCullingSide)
{
    Device device;
    OpenGLRenderer::setCullingSide(FaceMode::Front);
    EXPECT_EQ(device.driver.Calls(), Sequence({Call("glCullFace", 0x0404)}));
}

TEST(OpenGLRendererState, SetDepthFunc)
{
    Device device;
    OpenGLRenderer::setDepthFunc(DSFunc::Always);
    EXPECT_EQ(device.driver.Calls(), Sequence({Call("glDepthFunc", 0x0207)}));
}

TEST(OpenGLRendererState, SetWriteMaskIsColorThenDepth)
{
    Device device;
    OpenGLRenderer::setWriteMask(true, false);
    OpenGLRenderer::setWriteMask(false, true);
    EXPECT_EQ(device.driver.Calls(),
              Sequence({Call("glColorMask", 1, 1, 1, 1), Call("glDepthMask", 0),
                        Call("glColorMask", 0, 0, 0, 0), Call("glDepthMask", 1)}));
}

TEST(OpenGLRendererState, SetViewport)
{
    Device device;
    OpenGLRenderer::setViewport(-1, 2, 30u, 40u);
    EXPECT_EQ(device.driver.Calls(), Sequence({Call("glViewport", -1, 2, 30, 40)}));
}

TEST(OpenGLRendererState, SetScissor)
{
    Device device;
    OpenGLRenderer::setScissor(5, -6, 70u, 80u);
    EXPECT_EQ(device.driver.Calls(), Sequence({Call("glScissor", 5, -6, 70, 80)}));
}

TEST(OpenGLRendererState, GetViewportReturnsTheFourNumbers)
{
    Device device;
    glViewport(3, 5, 70, 90);
    device.driver.ForgetCalls();

    const OpenGLRenderer::Viewport viewport = OpenGLRenderer::getViewport();

    EXPECT_EQ(viewport.x, 3);
    EXPECT_EQ(viewport.y, 5);
    EXPECT_EQ(viewport.width, 70);
    EXPECT_EQ(viewport.height, 90);
    EXPECT_EQ(device.driver.CallNames(), Names({"glGetIntegerv"}));
    EXPECT_EQ(device.driver.LastCall("glGetIntegerv").Arg(0), 0x0BA2); // GL_VIEWPORT
}

TEST(OpenGLRendererState, ActivateTextureUnit2D)
{
    Device device;
    GLuint texture = 0;
    glGenTextures(1, &texture);
    device.driver.ForgetCalls();

    OpenGLRenderer::activateTextureUnit2D(2, static_cast<int>(texture));

    EXPECT_EQ(device.driver.Calls(),
              Sequence({Call("glActiveTexture", 0x84C2), Call("glBindTexture", 0x0DE1, texture)}));
}

TEST(OpenGLRendererState, BindFramebuffer)
{
    Device device;
    GLuint framebuffer = 0;
    glGenFramebuffers(1, &framebuffer);
    device.driver.ForgetCalls();

    OpenGLRenderer::bindFramebuffer(FramebufferTarget::ReadAndDraw, framebuffer);
    OpenGLRenderer::bindFramebuffer(FramebufferTarget::Read, 0);

    EXPECT_EQ(device.driver.Calls(), Sequence({Call("glBindFramebuffer", 0x8D40, framebuffer),
                                               Call("glBindFramebuffer", 0x8CA8, 0)}));
}

TEST(OpenGLRendererState, SetReadbackBufferLayout)
{
    Device device;
    OpenGLRenderer::setReadbackBufferLayout(ReadbackBufferLayout::RowLength, 128, nullptr);
    EXPECT_EQ(device.driver.Calls(), Sequence({Call("glPixelStorei", 0x0D02, 128)}));
}

TEST(OpenGLRendererState, SetReadbackBufferLayoutReadsThePreviousValueFirst)
{
    Device device;
    glPixelStorei(GL_PACK_ALIGNMENT, 8);
    device.driver.ForgetCalls();
    int previous = -1;

    OpenGLRenderer::setReadbackBufferLayout(ReadbackBufferLayout::Alignment, 1, &previous);

    EXPECT_EQ(previous, 8);
    EXPECT_EQ(device.driver.Calls(), Sequence({Call("glGetIntegerv", 0x0D05, &previous),
                                               Call("glPixelStorei", 0x0D05, 1)}));
}

TEST(OpenGLRendererState, Finish)
{
    Device device;
    OpenGLRenderer::finish();
    EXPECT_EQ(device.driver.Calls(), Sequence({Call("glFinish")}));
}

// ---- reading pixels -----------------------------------------------------------------------------

TEST(OpenGLRendererState, ReadPixelsLooksUpFormatAndType)
{
    Device device;
    unsigned char pixels[4] = {};

    OpenGLRenderer::readPixels(0, 0, 1, 1, pixels, static_cast<Nib::TextureTargetLayout>(2),
                               static_cast<Nib::TextureMemoryLayout>(6));

    EXPECT_EQ(device.driver.Calls(),
              Sequence({Call("glReadPixels", 0, 0, 1, 1, 0x1908, 0x1401, pixels)}));
}

TEST(OpenGLRendererState, ReadPixelsTakesEveryCellOfTheTables)
{
    // format, then the type of memory layout 0 to 16
    constexpr unsigned UB = 0x1401;
    constexpr unsigned US = 0x1403;
    constexpr unsigned S = 0x1402;
    constexpr unsigned UI = 0x1405;
    constexpr unsigned I = 0x1404;
    constexpr unsigned F = 0x1406;
    constexpr unsigned HF = 0x140B;
    struct Row
    {
        unsigned format;
        unsigned types[17];
    };
    // clang-format off
    const Row rows[] = {
        {0x1903, {UB, US, S, UI, I, UB, UB, F,  F, F, F, HF, UI, UB, 0, F,  0}},
        {0x8D94, {UB, US, S, UI, I, UB, UB, F,  F, F, F, HF, UI, UB, 0, 0,  0}},
        {0x1908, {0,  0,  0, 0,  0, 0,  UB, UB, F, F, F, HF, UI, 0,  F, UB, UB}},
        {0x1903, {UB, US, S, UI, I, UB, UB, F,  F, F, F, HF, UI, UB, 0, 0,  0}},
        {0x1902, {0,  0,  0, 0,  0, 0,  0,  0,  F, F, F, HF, UI, UB, 0, 0,  0}},
        {0x1907, {0,  0,  0, 0,  0, 0,  UB, UB, F, F, F, HF, UI, UB, 0, 0,  0}},
        {0x1909, {0,  0,  0, 0,  0, 0,  0,  0,  0, 0, 0, 0,  0,  UB, 0, 0,  0}},
        {0x80E1, {0,  0,  0, 0,  0, 0,  0,  0,  0, 0, 0, 0,  0,  UB, 0, UB, UB}},
    };
    // clang-format on
    Device device;
    device.driver.AllowMisuse("glReadPixels"); // most pairs are no format of a framebuffer
    unsigned char pixels[64] = {};
    for (int layout = 0; layout < 8; ++layout)
    {
        for (int memoryLayout = 0; memoryLayout < 17; ++memoryLayout)
        {
            device.driver.ForgetCalls();

            OpenGLRenderer::readPixels(0, 0, 1, 1, pixels,
                                       static_cast<Nib::TextureTargetLayout>(layout),
                                       static_cast<Nib::TextureMemoryLayout>(memoryLayout));

            EXPECT_EQ(device.driver.Calls(),
                      Sequence({Call("glReadPixels", 0, 0, 1, 1, rows[layout].format,
                                     rows[layout].types[memoryLayout], pixels)}))
                << layout << ", " << memoryLayout;
        }
    }
}
