#include "oracle/Shrink.h"

#include "oracle/Player.h"

#include <gtest/gtest.h>

// Where partial update alone does not make the picture right: the shortest example of each case,
// what is seen, and the habit of the caller that helps. docs/partial-update.md tells the same in
// words.

using namespace Oracle;
using Nib::RectF;

namespace
{

Caller Without(bool Caller::*habit)
{
    Caller caller;
    caller.*habit = false;
    return caller;
}

Caller WholeFrames()
{
    Caller caller;
    caller.namesEveryFrameWhole = true;
    return caller;
}

const RectF kPixel(0, 0, 1, 1); // the top left one

/// A window of one pixel.
Scenario OnePixel(int buffers, std::vector<Frame> frames)
{
    Scenario scenario;
    scenario.width = 1;
    scenario.height = 1;
    scenario.buffers = buffers;
    scenario.frames = std::move(frames);
    return scenario;
}

/// What a shorter example has to have in common with the one that is shown.
enum class Kind
{
    Any,
    OldBuffer, ///< the first wrong frame is the last, and its buffer holds an older frame
};

bool IsOfKind(Kind kind, Player& player, const Caller& caller, Scenario scenario)
{
    if (kind == Kind::Any)
        return true;
    if (scenario.frames.empty() || scenario.frames.back().age == 0)
        return false;
    scenario.frames.pop_back();
    return player.PlayAs(caller, scenario).empty();
}

/// The scenario shows something wrong to @p careless, nothing shorter of its kind does, and it
/// shows what it should to @p careful.
void ExpectLimit(Device device, const Caller& careless, const Scenario& scenario,
                 const std::string& seen, const Caller& careful = {}, Kind kind = Kind::Any)
{
    Player player(device);
    EXPECT_EQ(player.PlayAs(careless, scenario), seen);
    EXPECT_EQ(player.PlayAs(careful, scenario), "");
    const Scenario shortest = Shrunk(
        scenario, [&](const Scenario& s)
        { return IsOfKind(kind, player, careless, s) && !player.PlayAs(careless, s).empty(); });
    EXPECT_EQ(ToStatements(shortest), ToStatements(scenario));
}

} // namespace

// ---- 0x81: the part of the back buffer is posted that UseRect was last given --------------------

TEST(SubBufferLimit, RectangleIsPostedUnturned)
{
    // The upper pixel changes, the lower one is posted.
    Scenario scenario = OnePixel(1, {{0, {}}, {1, {kPixel}}});
    scenario.height = 2;

    ExpectLimit(Device::PostSubBuffer, Without(&Caller::turnsForSubBuffers), scenario,
                "frame 1, pixel (0, 0): (0, 0, 255, 255) instead of (1, 0, 254, 255)");
}

TEST(SubBufferLimit, FractionOfAPixelIsNotPosted)
{
    const Scenario scenario = OnePixel(1, {{0, {}}, {1, {RectF(0, 0, 0.5F, 1)}}});

    ExpectLimit(Device::PostSubBuffer, Without(&Caller::namesWholePixels), scenario,
                "frame 1, pixel (0, 0): (0, 0, 255, 255) instead of (1, 0, 254, 255)");
}

TEST(SubBufferLimit, RectangleBeyondTheWindowIsRefused)
{
    const Scenario scenario = OnePixel(1, {{0, {}}, {1, {RectF(-1, 0, 1, 1)}}});

    ExpectLimit(Device::PostSubBuffer, Without(&Caller::namesOnlyTheScreen), scenario,
                "frame 1, pixel (0, 0): (0, 0, 255, 255) instead of (1, 0, 254, 255)");
}

TEST(SubBufferLimit, OnlyTheLastRectangleOfAFrameIsPosted)
{
    const Scenario scenario = OnePixel(1, {{0, {}}, {1, {kPixel, RectF()}}});

    ExpectLimit(Device::PostSubBuffer, Without(&Caller::namesOneRectangle), scenario,
                "frame 1, pixel (0, 0): (0, 0, 255, 255) instead of (1, 0, 254, 255)");
}

TEST(SubBufferLimit, FirstFrameIsNotPostedByItself)
{
    const Scenario scenario = OnePixel(1, {{0, {}}});

    ExpectLimit(Device::PostSubBuffer, Without(&Caller::namesTheFirstFrameWhole), scenario,
                "frame 0, pixel (0, 0): (0, 0, 0, 0) instead of (0, 0, 255, 255)");
}

// ---- 0x45: the swap tells of the frame's damage; the back buffer is the caller's ----------------

TEST(DamageRegionLimit, ChangesOfEarlierFramesAreDrawnAgainByTheCaller)
{
    // The third frame gets the buffer of the first, which lacks what the second changed.
    Scenario scenario = OnePixel(2, {{0, {}}, {0, {kPixel}}, {2, {}}});

    ExpectLimit(Device::DamageRegion, Without(&Caller::drawsWhatTheModeAsks), scenario,
                "frame 2, pixel (0, 0): (0, 0, 255, 255) instead of (1, 0, 254, 255)", Caller(),
                Kind::OldBuffer);
}

TEST(DamageRegionLimit, FirstFrameIsDamagedOnlyWhereItIsTold)
{
    Scenario scenario = OnePixel(1, {{0, {kPixel}}});
    scenario.height = 2;

    ExpectLimit(Device::DamageRegion, Without(&Caller::namesTheFirstFrameWhole), scenario,
                "frame 0, pixel (0, 1): (0, 0, 0, 0) instead of (0, 0, 255, 255)");
}

TEST(DamageRegionLimit, FractionOfAPixelIsNotInTheScissorBox)
{
    // The fifth frame is the first whose history holds no full surface.
    const Scenario scenario =
        OnePixel(1, {{0, {}}, {1, {}}, {1, {}}, {1, {}}, {1, {RectF(0, 0, 0.5F, 1)}}});

    ExpectLimit(Device::DamageRegion, Without(&Caller::namesWholePixels), scenario,
                "frame 4, pixel (0, 0): (0, 0, 255, 255) instead of (1, 0, 254, 255)");
}

// ---- 0x07: whole tiles are drawn ----------------------------------------------------------------

TEST(TileAlignedLimit, ChangesOfEarlierFramesAreDrawnAgainByTheCaller)
{
    Scenario scenario = OnePixel(2, {{0, {}}, {0, {kPixel}}, {2, {}}});

    ExpectLimit(Device::TileAligned, Without(&Caller::drawsWhatTheModeAsks), scenario,
                "frame 2, pixel (0, 0): (0, 0, 255, 255) instead of (1, 0, 254, 255)", Caller(),
                Kind::OldBuffer);
}

TEST(TileAlignedLimit, TilesThatAreDrawnInPartLoseTheRest)
{
    Scenario scenario = OnePixel(1, {{0, {}}, {1, {kPixel}}});
    scenario.height = 2;

    ExpectLimit(Device::TileAligned, Without(&Caller::drawsWhatTheModeAsks), scenario,
                "frame 1, pixel (0, 1): (222, 173, 190, 239) instead of (0, 0, 255, 255)");
}

TEST(TileAlignedLimit, RotationBelowZeroCountsTilesFromTheWrongEdge)
{
    // One quarter turn back is three forward, whose tiles begin at the left; -1 aligns to the right.
    Player player(Device::TileAligned);
    Scenario scenario = OnePixel(1, {{0, {}}, {1, {}}, {1, {}}, {1, {}}, {1, {kPixel}}});
    scenario.width = 33;

    scenario.rotation = -1;
    EXPECT_EQ(player.Play(scenario),
              "frame 4, pixel (1, 0): (222, 173, 190, 239) instead of (0, 0, 255, 255)");
    scenario.rotation = 3;
    EXPECT_EQ(player.Play(scenario), "");
}

// ---- 0x25: what is drawn outside the tiled region is dropped ------------------------------------

TEST(TiledRenderingLimit, TiledRegionIsDrawnInFull)
{
    // The region is the whole screen, of which the second frame draws nothing.
    const Scenario scenario = OnePixel(1, {{0, {}}, {1, {}}});

    ExpectLimit(Device::TiledRendering, Without(&Caller::drawsWhatTheModeAsks), scenario,
                "frame 1, pixel (0, 0): (222, 173, 190, 239) instead of (0, 0, 255, 255)");
}

TEST(TiledRenderingLimit, FractionOfAPixelIsOutsideTheRegion)
{
    const Scenario scenario =
        OnePixel(1, {{0, {}}, {1, {}}, {1, {}}, {1, {}}, {1, {RectF(0, 0, 0.5F, 1)}}});

    ExpectLimit(Device::TiledRendering, Without(&Caller::namesWholePixels), scenario,
                "frame 4, pixel (0, 0): (0, 0, 255, 255) instead of (1, 0, 254, 255)");
}

TEST(TiledRenderingLimit, OnlyTheFirstRectangleOfAFrameStartsARegion)
{
    // The history is of rectangles, not of frames: the second frame fills it.
    const RectF none;
    const Scenario scenario = OnePixel(1, {{0, {}}, {1, {none, none, none}}, {1, {none, kPixel}}});

    ExpectLimit(Device::TiledRendering, Without(&Caller::namesOneRectangle), scenario,
                "frame 2, pixel (0, 0): (0, 0, 255, 255) instead of (1, 0, 254, 255)");
}

TEST(TiledRenderingLimit, FrameWithoutARectangleShowsAnOldBuffer)
{
    const Scenario scenario = OnePixel(2, {{0, {}}, {0, {kPixel}}, {2, {}}});

    ExpectLimit(Device::TiledRendering, Without(&Caller::namesEmptyFrames), scenario,
                "frame 2, pixel (0, 0): (0, 0, 255, 255) instead of (1, 0, 254, 255)", Caller(),
                Kind::OldBuffer);
}

TEST(TiledRenderingLimit, LostBufferWithAColouredCentreCountsAsKnown)
{
    // Nothing tells the age, and garbage is as good as a frame.
    const Scenario scenario = OnePixel(1, {{0, {}}, {1, {}}, {1, {}}, {1, {}}, {0, {}}});

    ExpectLimit(Device::TiledRenderingNoAge, Caller(), scenario,
                "frame 4, pixel (0, 0): (222, 173, 190, 239) instead of (0, 0, 255, 255)",
                WholeFrames());
}

TEST(TiledRenderingLimit, BufferOfUnknownAgeMayBeOlderThanTheHistory)
{
    // Two of three buffers take turns; then the third comes, which lacks the second frame.
    const Scenario scenario =
        OnePixel(3, {{0, {}}, {0, {kPixel}}, {0, {}}, {2, {}}, {2, {}}, {5, {}}});

    ExpectLimit(Device::TiledRenderingAgeless, Caller(), scenario,
                "frame 5, pixel (0, 0): (0, 0, 255, 255) instead of (1, 0, 254, 255)",
                WholeFrames(), Kind::OldBuffer);
}

// ---- 0x09: the surface keeps its content, once it was asked to ----------------------------------

TEST(PreservedLimit, ModeStaysWhereALaterSurfaceDoesNotKeepItsContent)
{
    const Scenario scenario = OnePixel(2, {{0, {}}, {0, {kPixel}}, {2, {}}});

    ExpectLimit(Device::PreservedOnce, Caller(), scenario,
                "frame 2, pixel (0, 0): (0, 0, 255, 255) instead of (1, 0, 254, 255)",
                WholeFrames());
}

TEST(PreservedLimit, FractionOfAPixelIsNotInTheScissorBox)
{
    const Scenario scenario = OnePixel(1, {{0, {}}, {1, {RectF(0, 0, 0.5F, 1)}}});

    ExpectLimit(Device::Preserved, Without(&Caller::namesWholePixels), scenario,
                "frame 1, pixel (0, 0): (0, 0, 255, 255) instead of (1, 0, 254, 255)");
}

// ---- 0x01: nothing is known of a back buffer ----------------------------------------------------

TEST(FullScreenLimit, EveryFrameIsDrawnInFull)
{
    const Scenario scenario = OnePixel(2, {{0, {}}, {0, {kPixel}}, {2, {}}});

    ExpectLimit(Device::FullScreen, Without(&Caller::drawsWhatTheModeAsks), scenario,
                "frame 2, pixel (0, 0): (0, 0, 255, 255) instead of (1, 0, 254, 255)", Caller(),
                Kind::OldBuffer);
}
