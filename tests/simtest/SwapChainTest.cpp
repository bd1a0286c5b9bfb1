#include "simtest/WindowFixture.h"

#include <gtest/gtest.h>

// What windows show and keep where a test sets their buffers, and what tiled GPUs lose.

namespace
{

constexpr SimPixel kRed{255, 0, 0, 255};
constexpr SimPixel kGreen{0, 255, 0, 255};
constexpr SimPixel kGarbage{0xDE, 0xAD, 0xBE, 0xEF};

/// A green window of 8 x 8 pixels, presented once, whose buffer is drawn into again.
struct GreenWindow
{
    explicit GreenWindow(SimDriver& driver, const SimSwapChain& chain)
        : setUp((driver.SetSwapChain(chain), driver)), fixture(driver)
    {
        ClearTo(0, 1, 0);
        eglSwapBuffers(fixture.display, fixture.surface);
    }

    SimPixel Back(int x, int y) const { return setUp.BackPixel(fixture.window, x, y); }

    SimDriver& setUp;
    WindowFixture fixture;
};

void RedBox(int x, int y, int width, int height)
{
    glEnable(GL_SCISSOR_TEST);
    glScissor(x, y, width, height);
    ClearTo(1, 0, 0);
    glDisable(GL_SCISSOR_TEST);
}

SimSwapChain Ages(std::vector<int> ages)
{
    SimSwapChain chain;
    chain.ages = std::move(ages);
    return chain;
}

SimSwapChain Tiles(bool fromRight, bool fromTop)
{
    SimSwapChain chain = Ages({0, 1});
    chain.tileSize = 5;
    chain.tilesFromRight = fromRight;
    chain.tilesFromTop = fromTop;
    return chain;
}

template <typename Function>
Function Extension(const char* name)
{
    return reinterpret_cast<Function>(eglGetProcAddress(name));
}

} // namespace

TEST(SwapChain, BuffersHaveTheAgesThatAreSet)
{
    SimDriver driver;
    GreenWindow window(driver, Ages({0, 0, 2, 6}));
    for (const int age : {0, 2, 6, 6})
    {
        EXPECT_EQ(window.fixture.Age(), age);
        eglSwapBuffers(window.fixture.display, window.fixture.surface);
    }
}

TEST(SwapChain, OldBufferHoldsItsFrame)
{
    SimDriver driver;
    GreenWindow window(driver, Ages({0, 1, 1, 1, 1, 6}));
    for (int frame = 0; frame < 5; ++frame)
    {
        ClearTo(1, 0, 0);
        eglSwapBuffers(window.fixture.display, window.fixture.surface);
    }

    EXPECT_EQ(window.Back(4, 4), kGreen);
}

TEST(SwapChain, LostBufferHoldsWhatIsSet)
{
    SimDriver driver;
    SimSwapChain chain = Ages({0, 0});
    chain.undefined = {1, 2, 3, 4};
    GreenWindow window(driver, chain);

    EXPECT_EQ(window.Back(4, 4), (SimPixel{1, 2, 3, 4}));
}

TEST(SwapChain, FrontPixelsCountRowsFromTheBottom)
{
    SimDriver driver;
    GreenWindow window(driver, Ages({0, 1}));
    RedBox(1, 0, 1, 1);
    eglSwapBuffers(window.fixture.display, window.fixture.surface);

    const std::vector<SimPixel> pixels = driver.FrontPixels(window.fixture.window);

    ASSERT_EQ(pixels.size(), 64u);
    EXPECT_EQ(pixels[0], kGreen);
    EXPECT_EQ(pixels[1], kRed);
    EXPECT_EQ(pixels[9], kGreen);
}

// ---- damage -------------------------------------------------------------------------------------

namespace
{

/// The corner pixel after a red frame whose damage is elsewhere.
SimPixel CornerOutsideTheDamage(bool damageIsAHint)
{
    SimDriver driver(SimGpu::Named("Mali-G72"));
    SimSwapChain chain = Ages({0, 1});
    chain.damageIsAHint = damageIsAHint;
    GreenWindow window(driver, chain);
    ClearTo(1, 0, 0);
    const EGLint damage[] = {4, 4, 2, 2};
    Extension<PFNEGLSWAPBUFFERSWITHDAMAGEKHRPROC>("eglSwapBuffersWithDamageKHR")(
        window.fixture.display, window.fixture.surface, damage, 1);
    EXPECT_EQ(driver.FrontPixel(window.fixture.window, 4, 4), kRed);
    return driver.FrontPixel(window.fixture.window, 0, 0);
}

} // namespace

TEST(SwapChain, DamageAloneIsShown)
{
    EXPECT_EQ(CornerOutsideTheDamage(false), kGreen);
}

TEST(SwapChain, DamageThatIsAHintShowsAll)
{
    EXPECT_EQ(CornerOutsideTheDamage(true), kRed);
}

// ---- tiles that are not loaded ------------------------------------------------------------------

TEST(SwapChain, FirstClearOfATileLosesTheRestOfIt)
{
    SimDriver driver;
    GreenWindow window(driver, Tiles(false, false));

    RedBox(0, 0, 1, 1);

    EXPECT_EQ(window.Back(0, 0), kRed);
    EXPECT_EQ(window.Back(4, 4), kGarbage);
    EXPECT_EQ(window.Back(5, 0), kGreen); // of the next tile
    EXPECT_EQ(window.Back(0, 5), kGreen);
}

TEST(SwapChain, SecondClearOfATileKeepsTheFirst)
{
    SimDriver driver;
    GreenWindow window(driver, Tiles(false, false));

    RedBox(0, 0, 1, 1);
    RedBox(2, 2, 1, 1);

    EXPECT_EQ(window.Back(0, 0), kRed);
}

TEST(SwapChain, TilesOfTheNextFrameAreLostAgain)
{
    SimDriver driver;
    GreenWindow window(driver, Tiles(false, false));
    RedBox(0, 0, 5, 5);
    eglSwapBuffers(window.fixture.display, window.fixture.surface);

    RedBox(2, 2, 1, 1);

    EXPECT_EQ(window.Back(0, 0), kGarbage);
}

TEST(SwapChain, TilesCountFromTheRightAndTheTop)
{
    SimDriver driver;
    GreenWindow window(driver, Tiles(true, true));

    RedBox(7, 7, 1, 1);

    // Tiles end at 8: the last ones begin at 3.
    EXPECT_EQ(window.Back(3, 3), kGarbage);
    EXPECT_EQ(window.Back(2, 3), kGreen);
    EXPECT_EQ(window.Back(3, 2), kGreen);
}

TEST(SwapChain, ClearAcrossTilesLosesAllOfThem)
{
    SimDriver driver;
    GreenWindow window(driver, Tiles(false, false));

    RedBox(4, 4, 2, 2);

    EXPECT_EQ(window.Back(0, 0), kGarbage);
    EXPECT_EQ(window.Back(7, 7), kGarbage);
    EXPECT_EQ(window.Back(0, 7), kGarbage);
    EXPECT_EQ(window.Back(4, 4), kRed);
}

// ---- tiled rendering ----------------------------------------------------------------------------

namespace
{

using StartTiling = void (*)(GLuint, GLuint, GLuint, GLuint, GLbitfield);
using EndTiling = void (*)(GLbitfield);

constexpr GLbitfield kColour = 0x1; // GL_COLOR_BUFFER_BIT0_QCOM

} // namespace

TEST(TiledRendering, NothingIsDrawnOutsideTheRegion)
{
    SimDriver driver(SimGpu::Named("Adreno (TM) 530"));
    GreenWindow window(driver, Ages({0, 1}));

    Extension<StartTiling>("glStartTilingQCOM")(2, 2, 4, 4, kColour);
    ClearTo(1, 0, 0);
    Extension<EndTiling>("glEndTilingQCOM")(kColour);

    EXPECT_EQ(window.Back(1, 2), kGreen);
    EXPECT_EQ(window.Back(2, 2), kRed);
    EXPECT_EQ(window.Back(5, 5), kRed);
    EXPECT_EQ(window.Back(6, 5), kGreen);
}

TEST(TiledRendering, RegionThatIsNotPreservedIsLost)
{
    SimDriver driver(SimGpu::Named("Adreno (TM) 530"));
    GreenWindow window(driver, Ages({0, 1}));

    Extension<StartTiling>("glStartTilingQCOM")(2, 2, 4, 4, 0);
    EXPECT_EQ(window.Back(2, 2), kGarbage);
    EXPECT_EQ(window.Back(1, 2), kGreen);
    RedBox(2, 2, 4, 4);
    Extension<EndTiling>("glEndTilingQCOM")(0);

    EXPECT_EQ(window.Back(2, 2), kGarbage); // colour was not kept at the end either
}

TEST(TiledRendering, DrawingIsFreeAgainBehindTheRegion)
{
    SimDriver driver(SimGpu::Named("Adreno (TM) 530"));
    GreenWindow window(driver, Ages({0, 1}));

    Extension<StartTiling>("glStartTilingQCOM")(0, 0, 0, 0, 0);
    ClearTo(1, 0, 0);
    EXPECT_EQ(window.Back(0, 0), kGreen); // an empty region takes nothing
    Extension<EndTiling>("glEndTilingQCOM")(kColour);
    ClearTo(1, 0, 0);

    EXPECT_EQ(window.Back(0, 0), kRed);
}
