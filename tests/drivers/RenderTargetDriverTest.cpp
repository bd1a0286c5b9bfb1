// Render targets on the process's driver: what is cleared, drawn and tested for depth and stencil
// is what is read back.

#include "drivers/ResourceContext.h"

#include <stdexcept>

using namespace Nib;

namespace
{

constexpr std::array<float, 4> kRed = {1, 0, 0, 1};
constexpr std::array<float, 4> kGreen = {0, 1, 0, 1};
constexpr Pixel kRedPixel = {255, 0, 0, 255};
constexpr Pixel kGreenPixel = {0, 255, 0, 255};
constexpr Pixel kBlack = {0, 0, 0, 0};

Owned<IDepthStencilState> DepthState(DepthStencilFunction function, bool write)
{
    DepthStencilStateDescriptor descriptor(true, false);
    descriptor.SetDepthFunction(function, write);
    return Owned<IDepthStencilState>(RendererFactory::CreateDepthStencilState(descriptor));
}

Owned<IDepthStencilState> StencilState(DepthStencilFunction function, unsigned char ref,
                                       StencilOperation onPass, unsigned char readMask = 0xFF,
                                       unsigned char writeMask = 0xFF)
{
    DepthStencilStateDescriptor descriptor(false, true);
    descriptor.SetStencilFunction(function, ref, readMask, writeMask);
    descriptor.SetStencilOperation(StencilOperation::Keep, StencilOperation::Keep, onPass);
    return Owned<IDepthStencilState>(RendererFactory::CreateDepthStencilState(descriptor));
}

} // namespace

using RenderTargetOnDriver = ResourceContext;

TEST_F(RenderTargetOnDriver, AnOffscreenTargetIsClearedToItsColor)
{
    const Owned<ITextureObject> texture = NewTexture(16, 8);
    const Owned<IOffscreenRenderTarget> target = NewTarget(texture.get());

    target->ClearColor(0.2f, 0.4f, 0.6f, 0.8f);

    EXPECT_EQ(PixelOf(*target, 0, 0), (Pixel{51, 102, 153, 204}));
    EXPECT_EQ(PixelOf(*target, 15, 7), (Pixel{51, 102, 153, 204}));
}

TEST_F(RenderTargetOnDriver, ActivationSetsFramebufferAndViewport)
{
    const Owned<ITextureObject> texture = NewTexture(16, 8);
    const Owned<IOffscreenRenderTarget> target = NewTarget(texture.get());
    glBindFramebuffer(GL_FRAMEBUFFER, 0);
    glViewport(1, 2, 3, 4);

    target->Activate();

    EXPECT_NE(Integer(GL_FRAMEBUFFER_BINDING), 0);
    EXPECT_EQ(FourIntegers(GL_VIEWPORT), (std::array<GLint, 4>{0, 0, 16, 8}));
}

TEST_F(RenderTargetOnDriver, ReadsARectangleIntoThePartOfMemoryThatIsDescribed)
{
    const Owned<ITextureObject> texture = NewTexture(16, 8);
    const Owned<IOffscreenRenderTarget> target = NewTarget(texture.get());
    target->ClearColor(1, 0, 0, 1);
    glEnable(GL_SCISSOR_TEST);
    glScissor(2, 1, 1, 1);
    target->ClearColor(0, 1, 0, 1);
    glDisable(GL_SCISSOR_TEST);
    glPixelStorei(GL_PACK_ROW_LENGTH, 9);
    glPixelStorei(GL_PACK_SKIP_PIXELS, 3);

    // (1, 1) to (3, 2), into rows of 5 pixels behind two rows and one pixel.
    std::vector<unsigned char> memory(5 * 4 * 4, 0x77);
    target->ReadPixels(1, 1, 2, 2, {memory.data(), 5, 2, 1});

    for (int y = 0; y < 4; ++y)
    {
        for (int x = 0; x < 5; ++x)
        {
            const unsigned char* const p = &memory[static_cast<std::size_t>(y * 5 + x) * 4];
            const Pixel pixel{p[0], p[1], p[2], p[3]};
            if (y < 2 || x < 1 || x > 2)
                EXPECT_EQ(pixel, (Pixel{0x77, 0x77, 0x77, 0x77})) << x << ", " << y;
            else
                EXPECT_EQ(pixel, x == 2 && y == 2 ? kGreenPixel : kRedPixel) << x << ", " << y;
        }
    }
    EXPECT_EQ(Integer(GL_PACK_ROW_LENGTH), 9);
    EXPECT_EQ(Integer(GL_PACK_SKIP_ROWS), 0);
    EXPECT_EQ(Integer(GL_PACK_SKIP_PIXELS), 3);
}

TEST_F(RenderTargetOnDriver, TheNearerQuadStaysInFront)
{
    const Owned<ITextureObject> texture = NewTexture(8, 8);
    const Owned<IDepthStencilBuffer> depth = NewDepthStencil(8, 8);
    const Owned<IOffscreenRenderTarget> target = NewTarget(texture.get());
    target->AttachDepthStencilBuffer(depth.get());
    target->ClearColor(0, 0, 0, 0);
    target->ClearDepthStencil(true, 1.0f, false, 0);
    const Owned<IDepthStencilState> state = DepthState(DepthStencilFunction::Less, true);
    state->Activate();

    DrawQuad(kGreen, 0.25f);
    DrawQuad(kRed, 0.75f);

    EXPECT_EQ(PixelOf(*target, 4, 4), kGreenPixel);
}

TEST_F(RenderTargetOnDriver, TheClearedDepthIsWhatIsComparedWith)
{
    const Owned<ITextureObject> texture = NewTexture(8, 8);
    const Owned<IDepthStencilBuffer> depth = NewDepthStencil(8, 8);
    const Owned<IOffscreenRenderTarget> target = NewTarget(texture.get());
    target->AttachDepthStencilBuffer(depth.get());
    const Owned<IDepthStencilState> state = DepthState(DepthStencilFunction::Less, true);
    state->Activate();
    target->ClearColor(0, 0, 0, 0);
    target->ClearDepthStencil(true, 0.5f, false, 0);

    DrawQuad(kRed, 0.6f);
    DrawQuad(kGreen, 0.4f, -1, -1, 0, 1); // the left half

    EXPECT_EQ(PixelOf(*target, 1, 4), kGreenPixel);
    EXPECT_EQ(PixelOf(*target, 6, 4), kBlack);
}

TEST_F(RenderTargetOnDriver, WithoutDepthWritesTheLaterQuadWins)
{
    const Owned<ITextureObject> texture = NewTexture(8, 8);
    const Owned<IDepthStencilBuffer> depth = NewDepthStencil(8, 8);
    const Owned<IOffscreenRenderTarget> target = NewTarget(texture.get());
    target->AttachDepthStencilBuffer(depth.get());
    target->ClearDepthStencil(true, 1.0f, false, 0);
    const Owned<IDepthStencilState> state = DepthState(DepthStencilFunction::Less, false);
    state->Activate();

    DrawQuad(kGreen, 0.25f);
    DrawQuad(kRed, 0.75f);

    EXPECT_EQ(PixelOf(*target, 4, 4), kRedPixel);
    glDepthMask(GL_TRUE);
}

struct DepthRow
{
    DepthStencilFunction function;
    bool below; ///< what passes against 0.5: depth 0.25,
    bool equal; ///< 0.5,
    bool above; ///< 0.75
};

TEST_F(RenderTargetOnDriver, EveryDepthFunctionComparesAsItsNameSays)
{
    const DepthRow rows[] = {
        {DepthStencilFunction::Never, false, false, false},
        {DepthStencilFunction::Less, true, false, false},
        {DepthStencilFunction::Equal, false, true, false},
        {DepthStencilFunction::LessOrEqual, true, true, false},
        {DepthStencilFunction::Greater, false, false, true},
        {DepthStencilFunction::NotEqual, true, false, true},
        {DepthStencilFunction::GreaterOrEqual, false, true, true},
        {DepthStencilFunction::Always, true, true, true},
    };
    const Owned<ITextureObject> texture = NewTexture(8, 8);
    const Owned<IDepthStencilBuffer> depth = NewDepthStencil(8, 8);
    const Owned<IOffscreenRenderTarget> target = NewTarget(texture.get());
    target->AttachDepthStencilBuffer(depth.get());
    const Owned<IDepthStencilState> always = DepthState(DepthStencilFunction::Always, true);
    for (const DepthRow& row : rows)
    {
        const Owned<IDepthStencilState> state = DepthState(row.function, false);
        const auto passes = [&](float z)
        {
            always->Activate();
            DrawQuad(kRed, 0.5f);
            state->Activate();
            DrawQuad(kGreen, z);
            unsigned char bytes[4] = {};
            glReadPixels(4, 4, 1, 1, GL_RGBA, GL_UNSIGNED_BYTE, bytes);
            return bytes[1] == 255;
        };
        EXPECT_EQ(passes(0.25f), row.below) << static_cast<int>(row.function);
        EXPECT_EQ(passes(0.5f), row.equal) << static_cast<int>(row.function);
        EXPECT_EQ(passes(0.75f), row.above) << static_cast<int>(row.function);
    }
    glDepthMask(GL_TRUE);
}

TEST_F(RenderTargetOnDriver, StencilLimitsDrawingToWhatWasMarked)
{
    const Owned<ITextureObject> texture = NewTexture(8, 8);
    const Owned<IDepthStencilBuffer> stencil = NewDepthStencil(8, 8);
    const Owned<IOffscreenRenderTarget> target = NewTarget(texture.get());
    target->AttachDepthStencilBuffer(stencil.get());
    target->ClearColor(0, 0, 0, 0);
    target->ClearDepthStencil(false, 0, true, 0);

    StencilState(DepthStencilFunction::Always, 5, StencilOperation::Replace)->Activate();
    DrawQuad(kRed, 0.5f, -1, -1, 0, 1); // marks the left half
    StencilState(DepthStencilFunction::Equal, 5, StencilOperation::Keep)->Activate();
    DrawQuad(kGreen);

    EXPECT_EQ(PixelOf(*target, 1, 4), kGreenPixel);
    EXPECT_EQ(PixelOf(*target, 6, 4), kBlack);
}

TEST_F(RenderTargetOnDriver, TheClearedStencilAndTheMasksAreWhatIsComparedWith)
{
    const Owned<ITextureObject> texture = NewTexture(8, 8);
    const Owned<IDepthStencilBuffer> stencil = NewDepthStencil(8, 8);
    const Owned<IOffscreenRenderTarget> target = NewTarget(texture.get());
    target->AttachDepthStencilBuffer(stencil.get());
    target->ClearColor(0, 0, 0, 0);
    target->ClearDepthStencil(false, 0, true, 0xA5);

    // 0xA5 and 0x05 differ outside the read mask only.
    StencilState(DepthStencilFunction::Equal, 0x05, StencilOperation::Zero, 0x0F, 0x01)->Activate();
    DrawQuad(kRed);
    EXPECT_EQ(PixelOf(*target, 4, 4), kRedPixel);

    // Reading has dropped the stencil; clear and mark once more, without reading in between.
    StencilState(DepthStencilFunction::Always, 0, StencilOperation::Keep)->Activate();
    target->ClearDepthStencil(false, 0, true, 0xA5);
    StencilState(DepthStencilFunction::Always, 0, StencilOperation::Zero, 0xFF, 0x01)->Activate();
    DrawQuad(kRed);
    StencilState(DepthStencilFunction::Equal, 0xA4, StencilOperation::Keep)->Activate();
    DrawQuad(kGreen);
    EXPECT_EQ(PixelOf(*target, 4, 4), kGreenPixel);
    StencilState(DepthStencilFunction::Always, 0, StencilOperation::Keep)->Activate();
}

TEST_F(RenderTargetOnDriver, ADetachedBufferNoLongerTestsDepth)
{
    const Owned<ITextureObject> texture = NewTexture(8, 8);
    const Owned<IDepthStencilBuffer> depth = NewDepthStencil(8, 8);
    const Owned<IOffscreenRenderTarget> target = NewTarget(texture.get());
    target->AttachDepthStencilBuffer(depth.get());
    target->ClearDepthStencil(true, 0.0f, false, 0);
    DepthState(DepthStencilFunction::Less, true)->Activate();

    target->DetachDepthStencilBuffer();
    DrawQuad(kGreen, 0.9f);

    EXPECT_EQ(PixelOf(*target, 4, 4), kGreenPixel);
}

TEST_F(RenderTargetOnDriver, ASecondBufferTakesThePlaceOfTheFirst)
{
    const Owned<ITextureObject> texture = NewTexture(8, 8);
    const Owned<IDepthStencilBuffer> first = NewDepthStencil(8, 8);
    const Owned<IDepthStencilBuffer> second = NewDepthStencil(8, 8);
    const Owned<IOffscreenRenderTarget> target = NewTarget(texture.get());
    DepthState(DepthStencilFunction::Less, true)->Activate();
    target->AttachDepthStencilBuffer(first.get());
    target->ClearDepthStencil(true, 0.0f, false, 0);
    target->AttachDepthStencilBuffer(second.get());
    target->ClearDepthStencil(true, 1.0f, false, 0);

    DrawQuad(kGreen, 0.5f);

    EXPECT_EQ(PixelOf(*target, 4, 4), kGreenPixel);
}

TEST_F(RenderTargetOnDriver, ATextureThatCannotBeDrawnIntoThrows)
{
    TextureDescriptor descriptor;
    descriptor.width = 8;
    descriptor.height = 8;
    descriptor.layout = TextureTargetLayout::Depth;
    descriptor.memoryLayout = TextureMemoryLayout::Depth32F;
    const Owned<ITextureObject> texture(
        RendererFactory::CreateTextureObject(descriptor, nullptr, nullptr, 0, nullptr));
    ASSERT_EQ(glGetError(), GLenum{GL_NO_ERROR});
    glBindFramebuffer(GL_FRAMEBUFFER, 0);

    EXPECT_THROW(RendererFactory::CreateOffscreenRenderTarget(texture.get()), std::logic_error);

    while (glGetError() != GL_NO_ERROR)
    {
    }
}

TEST_F(RenderTargetOnDriver, TheDefaultTargetIsTheSurface)
{
    const Owned<IRenderTarget> target(
        RendererFactory::CreateRenderTargetFromDefault(kWidth, kHeight));

    target->ClearColor(0.0f, 0.4f, 1.0f, 1.0f);

    EXPECT_EQ(PixelOf(*target, kWidth - 1, kHeight - 1), (Pixel{0, 102, 255, 255}));
    EXPECT_EQ(Integer(GL_FRAMEBUFFER_BINDING), 0);
}

TEST_F(RenderTargetOnDriver, TheCurrentTargetGoesBackToTheFramebufferItWasMadeOf)
{
    const Owned<ITextureObject> texture = NewTexture(8, 8);
    const Owned<ITextureObject> other = NewTexture(8, 8);
    const Owned<IOffscreenRenderTarget> owner = NewTarget(texture.get());
    owner->Activate();
    const Owned<IRenderTarget> current(RendererFactory::CreateRenderTargetFromCurrent(8, 8));
    const Owned<IOffscreenRenderTarget> another = NewTarget(other.get());
    another->ClearColor(1, 0, 0, 1);

    current->ClearColor(0, 1, 0, 1);

    EXPECT_EQ(PixelOf(*owner, 4, 4), kGreenPixel);
    EXPECT_EQ(PixelOf(*another, 4, 4), kRedPixel);
}

TEST_F(RenderTargetOnDriver, ADepthStencilBufferIsRebuiltAndServesANewTarget)
{
    const Owned<ITextureObject> texture = NewTexture(8, 8);
    const Owned<IDepthStencilBuffer> depth = NewDepthStencil(8, 8);
    Owned<IOffscreenRenderTarget> target = NewTarget(texture.get());
    target->AttachDepthStencilBuffer(depth.get());
    target.reset();
    queue->observer.DispatchRelease();
    queue->observer.DispatchRestore();

    target = NewTarget(texture.get());
    target->AttachDepthStencilBuffer(depth.get());
    target->ClearColor(0, 0, 0, 0);
    target->ClearDepthStencil(true, 0.5f, false, 0);
    DepthState(DepthStencilFunction::Less, true)->Activate();
    DrawQuad(kRed, 0.6f);
    DrawQuad(kGreen, 0.4f, -1, -1, 0, 1);

    EXPECT_EQ(PixelOf(*target, 1, 4), kGreenPixel);
    EXPECT_EQ(PixelOf(*target, 6, 4), kBlack);
}
