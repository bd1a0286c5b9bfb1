#include "Hand.h"
#include "Picture.h"
#include "RunNib.h"
#include "TestScreen.h"

#include <cstdio>
#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

namespace
{

class Latency : public testing::Test
{
protected:
    void SetUp() override
    {
        TestScreen screen;
        if (!screen.IsThere())
            GTEST_SKIP() << "no X server: DISPLAY is unset or does not answer";
        if (!Hand(screen.Connection()).IsThere())
            GTEST_SKIP() << "the X server has no XTEST extension";
    }
};

TEST_F(Latency, TellsPercentilesOfEachWayToTheScreen)
{
    const NibResult result = RunNib({"latency", "--taps", "5", "--size", "320x200"});
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.err, "");
    EXPECT_EQ(result.out.rfind("event to pixel, 5 taps each in 320x200; reading a pixel takes ", 0),
              0u)
        << result.out;
    for (const char* name : {"plain swap", "partial update"})
    {
        const std::size_t line = result.out.find(name);
        ASSERT_NE(line, std::string::npos) << result.out;
        float p50 = 0.0f, p99 = 0.0f;
        ASSERT_EQ(std::sscanf(result.out.c_str() + line + 14, " p50 %f ms, p99 %f ms", &p50, &p99),
                  2)
            << result.out;
        EXPECT_GT(p50, 0.0f);
        EXPECT_LE(p50, p99);
    }
    EXPECT_NE(result.out.find("front buffer   not granted: the display has no "
                              "EGL_KHR_mutable_render_buffer\n"),
              std::string::npos)
        << result.out;
}

TEST_F(Latency, WritesFiguresAsJsonAndAHistogram)
{
    TemporaryFolder folder;
    const std::string histogram = folder.Path("latency.png");
    const NibResult result =
        RunNib({"latency", "--taps", "4", "--size", "320x200", "--json", "-o", histogram});
    ASSERT_EQ(result.status, 0) << result.err;
    const nlohmann::json figures = nlohmann::json::parse(result.out);
    EXPECT_EQ(figures["taps"], 4);
    EXPECT_GT(figures["read_ms"], 0.0);
    ASSERT_EQ(figures["paths"].size(), 3u);
    EXPECT_EQ(figures["paths"][0]["name"], "plain swap");
    EXPECT_EQ(figures["paths"][0]["redrawn_share"], 1.0); // the whole window, every time
    EXPECT_EQ(figures["paths"][1]["name"], "partial update");
    EXPECT_LT(figures["paths"][1]["redrawn_share"], 0.05); // a tap in 64000 pixels
    EXPECT_EQ(figures["paths"][2]["name"], "front buffer");
    EXPECT_EQ(figures["paths"][2]["obstacle"], "the display has no EGL_KHR_mutable_render_buffer");

    const Picture picture = LoadPng(histogram);
    EXPECT_EQ(picture.width, 888);
    int bars = 0;
    for (int y = 0; y < picture.height; ++y)
        for (int x = 0; x < picture.width; ++x)
        {
            const std::uint8_t* const at = picture.At(x, y);
            bars += at[0] == 0x18 && at[1] == 0x24 && at[2] == 0x54; // of the partial update
        }
    EXPECT_GT(bars, 100);
}

TEST_F(Latency, NeedsRoomForItsTaps)
{
    const NibResult result = RunNib({"latency", "--taps", "100", "--size", "200x100"});
    EXPECT_EQ(result.status, 2);
    EXPECT_EQ(result.err, "nib: --taps: a window of this size has room for 88\n");
}

TEST(LatencyOptions, NeedADisplay)
{
    const NibResult result = RunNib({"latency"}, {{"DISPLAY", ""}});
    EXPECT_EQ(result.status, 2);
    EXPECT_EQ(result.err, "nib: latency: there is no display (DISPLAY is unset, or its server does "
                          "not answer)\n");
}

} // namespace
