#include "oracle/SwapChain.h"
#include "oracle/Page.h"
#include "oracle/Player.h"

#include <gtest/gtest.h>

using namespace Oracle;
using Nib::RectF;

namespace
{

using Ages = std::vector<int>;

/// A chain of so many buffers that were given out in turn, for so many frames.
SwapChain Used(int buffers, int frames)
{
    SwapChain chain(buffers);
    for (int frame = 0; frame < frames; ++frame)
        chain.Present(chain.Ages().back());
    return chain;
}

} // namespace

TEST(SwapChain, SingleBufferHoldsTheLastFrame)
{
    EXPECT_EQ(Used(1, 0).Ages(), (Ages{0}));
    EXPECT_EQ(Used(1, 1).Ages(), (Ages{0, 1}));
    EXPECT_EQ(Used(1, 9).Ages(), (Ages{0, 1}));
}

TEST(SwapChain, TwoBuffersTakeTurns)
{
    SwapChain chain(2);
    chain.Present(0);
    EXPECT_EQ(chain.Ages(), (Ages{0})); // the one on display is not given out
    chain.Present(0);
    EXPECT_EQ(chain.Ages(), (Ages{0, 2}));
    chain.Present(2);
    EXPECT_EQ(chain.Ages(), (Ages{0, 2}));
}

TEST(SwapChain, BufferThatIsLeftOutGrowsOld)
{
    SwapChain chain(3);
    for (int age : {0, 0, 0, 2, 2, 2})
        chain.Present(age);

    EXPECT_EQ(chain.Ages(), (Ages{0, 2, 6}));
}

TEST(SwapChain, NearestAgeIsTheNextOlder)
{
    SwapChain chain(3);
    for (int age : {0, 0, 0, 2, 2, 2})
        chain.Present(age);

    EXPECT_EQ(chain.Nearest(0), 0);
    EXPECT_EQ(chain.Nearest(2), 2);
    EXPECT_EQ(chain.Nearest(3), 6);
    EXPECT_EQ(chain.Nearest(7), 6);
}

TEST(SwapChain, RepairKeepsWhatIsPossible)
{
    Scenario scenario;
    scenario.buffers = 2;
    scenario.frames = {{0, {}}, {0, {}}, {2, {}}, {0, {}}, {2, {}}};

    EXPECT_EQ(Repaired(scenario), scenario);
}

TEST(SwapChain, RepairMakesAgesPossible)
{
    Scenario scenario;
    scenario.buffers = 2;
    scenario.frames = {{3, {}}, {1, {}}, {1, {}}, {9, {}}};

    const Scenario repaired = Repaired(scenario);

    EXPECT_EQ(repaired.frames, (std::vector<Frame>{{0, {}}, {0, {}}, {2, {}}, {2, {}}}));
}

TEST(SwapChain, ImpossibleAgesAreNotPlayed)
{
    Player player(Device::FullScreen);
    Scenario scenario;
    scenario.frames = {{1, {}}};

    EXPECT_EQ(player.Play(scenario), "the window's buffers cannot have these ages");
}

// ---- the page -----------------------------------------------------------------------------------

TEST(Page, PaintsEveryPixelThatIsTouched)
{
    Page page(4, 3);
    const SimPixel paper = page.Pixels()[0];

    page.Paint(RectF(0.5F, 1, 2.25F, 2));

    // The middle row of three, from the left end on.
    const SimPixel ink = page.Pixels()[4];
    EXPECT_NE(ink, paper);
    EXPECT_EQ(page.Pixels(), (std::vector<SimPixel>{paper, paper, paper, paper, ink, ink, ink,
                                                    paper, paper, paper, paper, paper}));
}

TEST(Page, PaintsNothingOutside)
{
    Page page(4, 3);
    const std::vector<SimPixel> before = page.Pixels();

    page.Paint(RectF(4, 0, 9, 3));
    page.Paint(RectF(-9, -9, 0, 1e30F));
    page.Paint(RectF(2, 2, 2, 3));

    EXPECT_EQ(page.Pixels(), before);
}

TEST(Page, RowsCountFromTheBottom)
{
    const Box top = TouchedPixels(RectF(1, 0, 3, 1), 4, 10);

    EXPECT_EQ(top.x, 1);
    EXPECT_EQ(top.y, 9);
    EXPECT_EQ(top.width, 2);
    EXPECT_EQ(top.height, 1);
}

TEST(Page, DrawsWithGlWhatItsPixelsSay)
{
    // Given a page, and a window that shows it in full
    SimDriver driver;
    ANativeWindow* const window = driver.Window(20, 30);
    Nib::EglContext context;
    context.Create(EGL_NO_CONTEXT, false, Nib::EglContext::Priority::Medium);
    Nib::Egl* const egl = Nib::Egl::GetInstance();
    const std::unique_ptr<Nib::EglSurface> surface(egl->CreateWindowSurface(window));
    egl->MakeCurrent(&context, surface.get());
    Page page(20, 30);
    page.Paint(RectF(2, 3, 12, 13));
    page.Paint(RectF(0, 5, 5, 30));
    page.Paint(RectF(4.5F, 6, 4.75F, 7));

    page.Draw(page.All());
    surface->SwapBuffers();

    EXPECT_EQ(driver.FrontPixels(window), page.Pixels());
    egl->MakeCurrent(nullptr, nullptr);
}
