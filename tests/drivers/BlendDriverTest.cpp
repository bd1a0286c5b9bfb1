// Blend states and the scissor on the process's driver: every mode gives the colours that its
// equation says.

#include "drivers/ResourceContext.h"

#include <algorithm>
#include <cmath>

using namespace Nib;

namespace
{

using Color = std::array<double, 4>;

constexpr Color kSource = {102 / 255.0, 153 / 255.0, 51 / 255.0, 204 / 255.0};
constexpr Color kDestination = {204 / 255.0, 51 / 255.0, 102 / 255.0, 153 / 255.0};
constexpr Color kConstant = {0.2, 0.6, 0.8, 0.4};

/// What channel @p i is multiplied with, by the number of the factor.
double FactorOf(int factor, std::size_t i)
{
    switch (factor)
    {
    case 0: return 0;
    case 1: return 1;
    case 2: return kSource[i];
    case 3: return 1 - kSource[i];
    case 4: return kDestination[i];
    case 5: return 1 - kDestination[i];
    case 6: return kSource[3];
    case 7: return 1 - kSource[3];
    case 8: return kDestination[3];
    case 9: return 1 - kDestination[3];
    case 10: return kConstant[i];
    case 11: return 1 - kConstant[i];
    case 12: return kConstant[3];
    default: return 1 - kConstant[3];
    }
}

double Blended(int function, int source, int destination, std::size_t i)
{
    const double s = kSource[i] * FactorOf(source, i);
    const double d = kDestination[i] * FactorOf(destination, i);
    switch (function)
    {
    case 0: return s + d;
    case 1: return s - d;
    case 2: return d - s;
    case 3: return std::min(kSource[i], kDestination[i]);
    default: return std::max(kSource[i], kDestination[i]);
    }
}

int Byte(double value)
{
    return static_cast<int>(std::lround(std::clamp(value, 0.0, 1.0) * 255));
}

std::array<float, 4> Floats(const Color& color)
{
    return {static_cast<float>(color[0]), static_cast<float>(color[1]),
            static_cast<float>(color[2]), static_cast<float>(color[3])};
}

/// A small target on which a quad is blended over a clear colour.
class BlendOnDriver : public ResourceContext
{
protected:
    void SetUp() override
    {
        ResourceContext::SetUp();
        if (IsSkipped() || HasFatalFailure())
            return;
        m_texture = NewTexture(2, 2);
        m_target = NewTarget(m_texture.get());
        glBlendColor(0.2f, 0.6f, 0.8f, 0.4f);
    }
    void TearDown() override
    {
        m_target.reset();
        m_texture.reset();
        ResourceContext::TearDown();
    }

    Pixel Draw(IBlendStateObject& state)
    {
        const std::array<float, 4> under = Floats(kDestination);
        glColorMask(GL_TRUE, GL_TRUE, GL_TRUE, GL_TRUE);
        m_target->ClearColor(under[0], under[1], under[2], under[3]);
        state.Activate();
        DrawQuad(Floats(kSource));
        return PixelOf(*m_target, 1, 1);
    }

    IRenderTarget& Target() { return *m_target; }

private:
    Owned<ITextureObject> m_texture;
    Owned<IOffscreenRenderTarget> m_target;
};

} // namespace

TEST_F(BlendOnDriver, EveryPairOfFactorsGivesTheColorsOfItsEquation)
{
    const Owned<IBlendStateObject> state(
        RendererFactory::CreateBlendStateObject(BlendStateDescriptor(true)));
    for (int source = 0; source < 14; ++source)
    {
        for (int destination = 0; destination < 14; ++destination)
        {
            // Alpha runs through the same pairs in another order.
            const int alphaSource = 13 - source;
            const int alphaDestination = (destination + 5) % 14;
            BlendStateDescriptor descriptor(true);
            descriptor.SetColorBlendingMode(BlendingFunction::Add,
                                            static_cast<BlendingFactor>(source),
                                            static_cast<BlendingFactor>(destination));
            descriptor.SetAlphaBlendingMode(BlendingFunction::Add,
                                            static_cast<BlendingFactor>(alphaSource),
                                            static_cast<BlendingFactor>(alphaDestination));
            state->SetDescriptor(descriptor);

            EXPECT_EQ(Draw(*state), (Pixel{Byte(Blended(0, source, destination, 0)),
                                           Byte(Blended(0, source, destination, 1)),
                                           Byte(Blended(0, source, destination, 2)),
                                           Byte(Blended(0, alphaSource, alphaDestination, 3))}))
                << source << ", " << destination;
        }
    }
}

TEST_F(BlendOnDriver, EveryPairOfFunctionsGivesTheColorsOfItsEquation)
{
    const int source = 6;      // source alpha
    const int destination = 1; // one
    for (int color = 0; color < 5; ++color)
    {
        for (int alpha = 0; alpha < 5; ++alpha)
        {
            BlendStateDescriptor descriptor(true);
            descriptor.SetColorBlendingMode(static_cast<BlendingFunction>(color),
                                            static_cast<BlendingFactor>(source),
                                            static_cast<BlendingFactor>(destination));
            descriptor.SetAlphaBlendingMode(static_cast<BlendingFunction>(alpha),
                                            static_cast<BlendingFactor>(destination),
                                            static_cast<BlendingFactor>(source));
            const Owned<IBlendStateObject> state(
                RendererFactory::CreateBlendStateObject(descriptor));

            EXPECT_EQ(Draw(*state), (Pixel{Byte(Blended(color, source, destination, 0)),
                                           Byte(Blended(color, source, destination, 1)),
                                           Byte(Blended(color, source, destination, 2)),
                                           Byte(Blended(alpha, destination, source, 3))}))
                << color << ", " << alpha;
        }
    }
}

TEST_F(BlendOnDriver, TheDefaultBlendsPremultipliedColors)
{
    const Owned<IBlendStateObject> state(
        RendererFactory::CreateBlendStateObject(BlendStateDescriptor(true)));

    // 102 + 204 * 0.2, 153 + 51 * 0.2, 51 + 102 * 0.2, 204 + 153 * 0.2
    EXPECT_EQ(Draw(*state), (Pixel{143, 163, 71, 235}));
}

TEST_F(BlendOnDriver, WithoutBlendingTheSourceReplaces)
{
    const Owned<IBlendStateObject> state(
        RendererFactory::CreateBlendStateObject(BlendStateDescriptor(false)));

    EXPECT_EQ(Draw(*state), (Pixel{102, 153, 51, 204}));
}

TEST_F(BlendOnDriver, WithoutColorWritesNothingChanges)
{
    for (const bool enabled : {true, false})
    {
        const Owned<IBlendStateObject> state(
            RendererFactory::CreateBlendStateObject(BlendStateDescriptor(enabled, false)));

        EXPECT_EQ(Draw(*state), (Pixel{204, 51, 102, 153}));
    }
    glColorMask(GL_TRUE, GL_TRUE, GL_TRUE, GL_TRUE);
}

TEST_F(BlendOnDriver, TheScissorLimitsWhatIsCleared)
{
    IRasterizerState* const rasterizer = RendererFactory::GetRasterizerState();
    Target().ClearColor(1, 0, 0, 1);
    rasterizer->SetScissorRect({1, 0, 1, 2});
    rasterizer->SetScissorEnabled(true);

    Target().ClearColor(0, 1, 0, 1);

    EXPECT_TRUE(rasterizer->IsScissorEnabled());
    const IRasterizerState::ScissorRect rect = rasterizer->GetScissorRect();
    EXPECT_EQ((std::array<int, 4>{rect.x, rect.y, rect.width, rect.height}),
              (std::array<int, 4>{1, 0, 1, 2}));
    rasterizer->SetScissorEnabled(false);
    EXPECT_FALSE(rasterizer->IsScissorEnabled());
    EXPECT_EQ(PixelOf(Target(), 0, 1), (Pixel{255, 0, 0, 255}));
    EXPECT_EQ(PixelOf(Target(), 1, 1), (Pixel{0, 255, 0, 255}));
}
