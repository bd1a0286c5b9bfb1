#include "Picture.h"
#include "RunNib.h"
#include "TestScreen.h"

#include <gtest/gtest.h>
#include <optional>
#include <string>

namespace
{

void ExpectWindowEqualsPage(const std::string& file)
{
    TestScreen screen;
    if (!screen.IsThere())
        GTEST_SKIP() << "no X server: DISPLAY is unset or does not answer";
    TemporaryFolder folder;
    const std::string page = folder.Path("page.png");
    const std::string alone = folder.Path("alone.png");

    RunningNib nib({"draw", file, "--window", "--speed", "max", "--keep", "-o", page});
    const std::string figures = nib.ReadLine(); // printed when all is drawn and written
    ASSERT_NE(figures.find("strokes"), std::string::npos) << nib.Finish().err;
    const std::optional<Window> window = screen.WindowNamed("nib draw");
    ASSERT_TRUE(window);
    const Picture expected = LoadPng(page);
    EXPECT_LE(LargestDifference(screen.ContentOnceEqual(*window, expected), expected), 1);

    ASSERT_EQ(RunNib({"draw", file, "-o", alone}, {{"DISPLAY", ""}}).status, 0);
    EXPECT_LE(LargestDifference(LoadPng(alone), expected), 1);
}

TEST(Window, ShowsThePageOfTheSample)
{
    ExpectWindowEqualsPage(NIB_SAMPLE);
}

TEST(Window, ShowsThirtySecondsOfPainting)
{
    const std::string file = FurtherRecording("libmypaint/painting30sec.dat");
    if (file.empty())
        GTEST_SKIP() << "NIB_STROKES does not name the folder of further recordings";
    ExpectWindowEqualsPage(file);
}

TEST(Window, ClosesWhenItsUserAsks)
{
    TestScreen screen;
    if (!screen.IsThere())
        GTEST_SKIP() << "no X server: DISPLAY is unset or does not answer";
    RunningNib nib({"draw", NIB_SAMPLE, "--window", "--speed", "max", "--keep"});
    ASSERT_NE(nib.ReadLine().find("strokes"), std::string::npos);
    const std::optional<Window> window = screen.WindowNamed("nib draw");
    ASSERT_TRUE(window);

    screen.AskToClose(*window);

    const NibResult result = nib.Finish();
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.err, "");
}

TEST(FrontBuffer, SaysWhyNotAndDrawsFrames)
{
    TestScreen screen;
    if (!screen.IsThere())
        GTEST_SKIP() << "no X server: DISPLAY is unset or does not answer";
    TemporaryFolder folder;
    const NibResult result = RunNib({"draw", NIB_SAMPLE, "--window", "--speed", "max",
                                     "--front-buffer", "-o", folder.Path("page.png")});
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.err, "nib: --front-buffer: the display has no EGL_KHR_mutable_render_buffer; "
                          "drawing frames instead\n");
    EXPECT_NE(result.out.find("433 frames"), std::string::npos);
}

} // namespace
