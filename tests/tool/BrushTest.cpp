#include "Picture.h"
#include "RunNib.h"

#include <array>
#include <cstdlib>
#include <gtest/gtest.h>
#include <string>

namespace
{

const std::map<std::string, std::string> kNoDisplay = {{"DISPLAY", ""}};

using Pixel = std::array<int, 4>;

/// Draws strokes given as InkML traces, one page pixel a unit, onto pages of 100 x 100.
class Brush : public testing::Test
{
protected:
    using Words = std::vector<std::string>;

    Picture Drawn(const std::string& traces, const Words& options)
    {
        const std::string file = m_folder.Write("in", kHead + traces + "</ink>");
        Words words = {"draw", file, "-o", Page(), "--scale", "1:1", "--size", "100x100"};
        words.insert(words.end(), options.begin(), options.end());
        const NibResult result = RunNib(words, kNoDisplay);
        EXPECT_EQ(result.status, 0) << result.err;
        return LoadPng(Page());
    }

    static Pixel At(const Picture& picture, int x, int y)
    {
        const std::uint8_t* const pixel = picture.At(x, y);
        return {pixel[0], pixel[1], pixel[2], pixel[3]};
    }

    static void ExpectNear(const Pixel& pixel, const Pixel& expected)
    {
        for (std::size_t channel = 0; channel < 4; ++channel)
            EXPECT_NEAR(pixel[channel], expected[channel], 1) << "channel " << channel;
    }

    std::string Page() const { return m_folder.Path("page.png"); }

    /// How many pixels of column @p x are not paper, with white paper.
    static int InkInColumn(const Picture& picture, int x)
    {
        int count = 0;
        for (int y = 0; y < picture.height; ++y)
            count += picture.At(x, y)[1] < 250 ? 1 : 0;
        return count;
    }

    /// The sum of what the ink takes from the paper's light, channel 1.
    static long Darkness(const Picture& picture)
    {
        long sum = 0;
        for (std::size_t i = 1; i < picture.pixels.size(); i += 4)
            sum += 255 - picture.pixels[i];
        return sum;
    }

    static constexpr const char* kHead =
        "<ink><traceFormat><channel name=\"X\"/><channel name=\"Y\"/>"
        "<channel name=\"F\" min=\"0\" max=\"1\"/><channel name=\"OE\" units=\"deg\"/>"
        "<channel name=\"OA\" units=\"deg\"/></traceFormat>";
    // One stroke that crosses itself at (50, 50).
    static constexpr const char* kLoop =
        "<trace>10 50 1 90 0,35 50 1 90 0,65 50 1 90 0,90 50 1 90 0,90 20 1 90 0,50 20 1 90 0,"
        "50 35 1 90 0,50 65 1 90 0,50 90 1 90 0</trace>";
    TemporaryFolder m_folder;
};

TEST_F(Brush, PressureGivesThePenItsWidth)
{
    const char* const line = "<trace>10 50 1 90 0,50 50 1 90 0</trace>"
                             "<trace>60 50 0 90 0,90 50 0 90 0</trace>";
    const Picture picture = Drawn(line, {"--width", "20"});
    EXPECT_NEAR(InkInColumn(picture, 30), 20, 1);
    EXPECT_NEAR(InkInColumn(picture, 75), 4, 1); // a fifth
}

TEST_F(Brush, PenHasRoundCapsAndJoins)
{
    const Picture picture =
        Drawn("<trace>30 70 1 90 0,30 30 1 90 0,70 30 1 90 0</trace>", {"--width", "20"});
    EXPECT_TRUE(picture.IsInk(30, 78));  // beyond the first point, by nearly the radius
    EXPECT_FALSE(picture.IsInk(22, 78)); // a square cap would reach there
    EXPECT_TRUE(picture.IsInk(78, 30));
    EXPECT_FALSE(picture.IsInk(78, 22));
    EXPECT_FALSE(picture.IsInk(21, 21)); // a mitred corner would reach there
}

TEST_F(Brush, ColoursOfInkAndPaperAreThoseAskedFor)
{
    const Picture picture =
        Drawn(kLoop, {"--color", "#0080ff", "--paper", "#102030", "--width", "10"});
    EXPECT_EQ(At(picture, 30, 50), (Pixel{0, 128, 255, 255}));
    EXPECT_EQ(At(picture, 5, 5), (Pixel{16, 32, 48, 255}));
}

TEST_F(Brush, NamedColoursAndShortDigits)
{
    const Picture picture = Drawn(kLoop, {"--color", "black", "--paper", "#fc0", "--width", "10"});
    EXPECT_EQ(At(picture, 30, 50), (Pixel{0, 0, 0, 255}));
    EXPECT_EQ(At(picture, 5, 5), (Pixel{255, 204, 0, 255}));
}

TEST_F(Brush, TransparentPaperStaysTransparent)
{
    const Picture picture = Drawn(kLoop, {"--color", "red", "--paper", "transparent"});
    EXPECT_EQ(At(picture, 5, 5)[3], 0);
    EXPECT_EQ(At(picture, 30, 50), (Pixel{214, 40, 40, 255}));
}

TEST_F(Brush, MarkerLaysOneCoatWhereAStrokeCrossesItself)
{
    const Picture picture =
        Drawn(kLoop, {"--brush", "marker", "--color", "#ff0000", "--width", "12"});
    const Pixel once = At(picture, 30, 50);
    ExpectNear(once, {255, 128, 128, 255});
    for (int y = 46; y < 54; ++y)
        for (int x = 46; x < 54; ++x)
            ExpectNear(At(picture, x, y), once);
    ExpectNear(At(picture, 90, 35), once); // where it turns
}

TEST_F(Brush, TwoStrokesOfAMarkerAreTwoCoats)
{
    const Picture picture = Drawn("<trace>10 50 1 90 0,90 50 1 90 0</trace>"
                                  "<trace>50 10 1 90 0,50 90 1 90 0</trace>",
                                  {"--brush", "marker", "--color", "#ff0000", "--width", "12"});
    ExpectNear(At(picture, 30, 50), {255, 128, 128, 255});
    ExpectNear(At(picture, 50, 30), {255, 128, 128, 255});
    ExpectNear(At(picture, 50, 50), {255, 64, 64, 255});
}

TEST_F(Brush, MarkerIsAsWideHoweverItIsPressed)
{
    const Picture picture = Drawn("<trace>10 50 1 90 0,50 50 0.5 90 0,90 50 0 90 0</trace>",
                                  {"--brush", "marker", "--width", "20"});
    EXPECT_NEAR(InkInColumn(picture, 15), 20, 1);
    EXPECT_NEAR(InkInColumn(picture, 85), 20, 1);
}

TEST_F(Brush, TranslucentPenLaysOneCoat)
{
    const Picture picture = Drawn(kLoop, {"--color", "#ff000080", "--width", "12"});
    const Pixel once = At(picture, 30, 50);
    ExpectNear(once, {255, 127, 127, 255});
    ExpectNear(At(picture, 50, 50), once);
    ExpectNear(At(picture, 90, 35), once);
}

TEST_F(Brush, StampIsDarkerAndWiderWherePressedHarder)
{
    const Words stamp = {"--brush", "stamp", "--width", "20", "--color", "black"};
    const Picture light = Drawn("<trace>20 50 0.1 90 0,80 50 0.1 90 0</trace>", stamp);
    const Picture hard = Drawn("<trace>20 50 1 90 0,80 50 1 90 0</trace>", stamp);
    EXPECT_GT(Darkness(light), 0);
    EXPECT_GT(Darkness(hard), 3 * Darkness(light));
    EXPECT_GT(InkInColumn(hard, 50), InkInColumn(light, 50) + 4);
}

TEST_F(Brush, StampHasAGrain)
{
    const Picture picture =
        Drawn("<trace>50 50 1 90 0</trace>", {"--brush", "stamp", "--width", "60"});
    int ink = 0, paper = 0;
    for (int y = 40; y < 60; ++y)
        for (int x = 40; x < 60; ++x)
            (picture.At(x, y)[1] < 100 ? ink : paper) += 1;
    EXPECT_GT(ink, 60);
    EXPECT_GT(paper, 60);
}

TEST_F(Brush, StampIsStretchedWhereThePenLeans)
{
    const Words stamp = {"--brush", "stamp", "--width", "30"};
    const auto extents = [](const Picture& picture)
    {
        int left = 100, right = 0, top = 100, bottom = 0;
        for (int y = 0; y < 100; ++y)
            for (int x = 0; x < 100; ++x)
                if (picture.At(x, y)[1] < 250)
                {
                    left = std::min(left, x), right = std::max(right, x);
                    top = std::min(top, y), bottom = std::max(bottom, y);
                }
        return std::array<int, 2>{right - left + 1, bottom - top + 1};
    };
    const auto upright = extents(Drawn("<trace>50 50 1 90 0</trace>", stamp));
    EXPECT_NEAR(upright[0], 28, 3);
    EXPECT_NEAR(upright[1], 28, 3);
    const auto toTheRight = extents(Drawn("<trace>50 50 1 30 0</trace>", stamp));
    EXPECT_NEAR(toTheRight[0], 56, 5); // twice as long
    EXPECT_NEAR(toTheRight[1], 28, 3);
    const auto downward = extents(Drawn("<trace>50 50 1 30 90</trace>", stamp));
    EXPECT_NEAR(downward[0], 28, 3);
    EXPECT_NEAR(downward[1], 56, 5);
}

TEST_F(Brush, BadOptionsAreNamed)
{
    const auto error = [](const std::string& option, const std::string& value)
    {
        const NibResult result =
            RunNib({"draw", NIB_SAMPLE, "-o", "/nowhere/x.png", option, value}, kNoDisplay);
        EXPECT_EQ(result.status, 2);
        return result.err;
    };
    EXPECT_EQ(error("--brush", "quill"), "nib: --brush: 'quill' is none of pen, marker, stamp\n");
    EXPECT_EQ(error("--color", "#12"),
              "nib: --color: '#12' is neither #rgb, #rrggbb, #rrggbbaa nor one of black, grey, "
              "white, red, orange, yellow, green, blue, violet, brown, transparent\n");
    EXPECT_EQ(error("--paper", "snow").substr(0, 40), "nib: --paper: 'snow' is neither #rgb, #r");
    for (const char* width : {"0", "-1", "1001", "wide", "nan", "2px", ""})
        EXPECT_EQ(error("--width", width), std::string("nib: --width: '") + width +
                                               "' is not a number of pixels from 0.1 to 1000\n");
}

// ---- the same page, however it comes about ------------------------------------------------------

class EveryBrush : public testing::TestWithParam<const char*>
{
protected:
    Picture Sample(std::vector<std::string> options)
    {
        const std::string page = m_folder.Path("page.png");
        options.insert(options.begin(), {"draw", NIB_SAMPLE, "-o", page, "--size", "640x400",
                                         "--brush", GetParam()});
        const NibResult result = RunNib(options, kNoDisplay);
        EXPECT_EQ(result.status, 0) << result.err;
        return LoadPng(page);
    }

    TemporaryFolder m_folder;
};

TEST_P(EveryBrush, LosesNothingWithTheContext)
{
    const Picture whole = Sample({});
    EXPECT_EQ(Sample({"--lose-context", "every:19"}).pixels, whole.pixels);
    EXPECT_EQ(Sample({"--lose-context", "every:1000000"}).pixels, whole.pixels);
}

TEST_P(EveryBrush, ExportsThePageThatItDraws)
{
    const Picture whole = Sample({"--export", "1"});
    EXPECT_EQ(LoadPng(m_folder.Path("page-1.png")).pixels, whole.pixels);
}

INSTANTIATE_TEST_SUITE_P(Kinds, EveryBrush, testing::Values("pen", "marker", "stamp"),
                         [](const auto& kind) { return std::string(kind.param); });

} // namespace
