#include "Picture.h"
#include "Recording.h"
#include "RunNib.h"

#include <gtest/gtest.h>
#include <sstream>
#include <string>

namespace
{

const std::map<std::string, std::string> kNoDisplay = {{"DISPLAY", ""}};

/// Strokes as an InkML file of plain traces, to be drawn in recorded units.
std::string InkMlOf(const Ink::Recording& recording, std::size_t first, std::size_t last)
{
    std::ostringstream text;
    text.precision(9);
    text << "<ink><traceFormat><channel name=\"X\"/><channel name=\"Y\"/>"
            "<channel name=\"F\" min=\"0\" max=\"1\"/></traceFormat>\n";
    for (std::size_t stroke = first; stroke < last; ++stroke)
    {
        text << "<trace>";
        const char* comma = "";
        for (const Ink::Sample& sample : recording.strokes[stroke])
        {
            text << comma << sample.x / 4 << ' ' << sample.y / 4 << ' ' << sample.pressure;
            comma = ",";
        }
        text << "</trace>\n";
    }
    text << "</ink>\n";
    return text.str();
}

TEST(Export, PagesEqualThoseDrawnAlone)
{
    TemporaryFolder folder;
    const Ink::Recording recording = Ink::ReadRecording(NIB_SAMPLE);
    ASSERT_EQ(recording.strokes.size(), 9u);
    const std::string all = folder.Write("all.inkml", InkMlOf(recording, 0, 9));
    const NibResult result =
        RunNib({"draw", all, "-o", folder.Path("page.png"), "--scale", "1:1", "--export", "3"},
               kNoDisplay);
    ASSERT_EQ(result.status, 0) << result.err;

    for (std::size_t page = 0; page < 3; ++page)
    {
        const std::string part =
            folder.Write("part.inkml", InkMlOf(recording, 3 * page, 3 * page + 3));
        ASSERT_EQ(
            RunNib({"draw", part, "-o", folder.Path("alone.png"), "--scale", "1:1"}, kNoDisplay)
                .status,
            0);
        const Picture exported = LoadPng(folder.Path("page-" + std::to_string(page + 1) + ".png"));
        EXPECT_EQ(LargestDifference(exported, LoadPng(folder.Path("alone.png"))), 0);
    }
    EXPECT_EQ(folder.Files(),
              (std::vector<std::string>{"all.inkml", "alone.png", "page-1.png", "page-2.png",
                                        "page-3.png", "page.png", "part.inkml"}));
}

TEST(LoseContext, LeavesThePictureAsItIs)
{
    TemporaryFolder folder;
    const std::string whole = folder.Path("whole.png"), lost = folder.Path("lost.png");
    ASSERT_EQ(RunNib({"draw", NIB_SAMPLE, "-o", whole}, kNoDisplay).status, 0);
    for (const std::string every : {"every:1000000", "every:100", "every:17"})
    {
        const NibResult result =
            RunNib({"draw", NIB_SAMPLE, "-o", lost, "--lose-context", every}, kNoDisplay);
        ASSERT_EQ(result.status, 0) << result.err;
        EXPECT_EQ(LargestDifference(LoadPng(lost), LoadPng(whole)), 0) << every;
    }
}

/// How often a text occurs in a log.
int Count(const std::string& log, const std::string& text)
{
    int count = 0;
    for (std::size_t at = log.find(text); at != std::string::npos; at = log.find(text, at + 1))
        ++count;
    return count;
}

TEST(LoseContext, BuildsProgramsFromTheCache)
{
    TemporaryFolder folder;
    std::map<std::string, std::string> environment = kNoDisplay;
    environment["NIB_LOG"] = "info";
    environment["NIB_CACHE_DIR"] = folder.Path("sdk");
    const NibResult result =
        RunNib({"draw", NIB_SAMPLE, "-o", folder.Path("page.png"), "--lose-context", "every:100"},
               environment);
    ASSERT_EQ(result.status, 0) << result.err;
    // 433 samples: four losses, each followed by a load. The first build compiled.
    EXPECT_EQ(Count(result.err, "RenderThreadOffscreenGLImpl::DoResume()\n"), 4);
    EXPECT_EQ(Count(result.err, " - Binary shader exists in cache\n"), 4);
    EXPECT_EQ(Count(result.err, "attribute = a_position\n"), 1);
    EXPECT_EQ(Count(result.err, "cached binary shader is not valid"), 0);
}

TEST(EngineeringBuild, NothingIsLeftAtTheEnd)
{
    TemporaryFolder folder;
    std::map<std::string, std::string> environment = kNoDisplay;
    environment["NIB_LOG"] = "debug";
    environment["NIB_BUILD_TYPE"] = "eng";
    environment["NIB_CACHE_DIR"] = folder.Path("sdk");
    const NibResult result = RunNib({"draw", NIB_SAMPLE, "-o", folder.Path("page.png"),
                                     "--lose-context", "every:100", "--export", "2"},
                                    environment);
    ASSERT_EQ(result.status, 0) << result.err;
    EXPECT_EQ(Count(result.err, "resource leak detected"), 0);
    EXPECT_EQ(Count(result.err, "RESOURCE LEAK"), 0);
}

TEST(LoseContext, BadOptionIsNamed)
{
    const NibResult result =
        RunNib({"draw", NIB_SAMPLE, "-o", "/nowhere/x.png", "--lose-context", "often"}, kNoDisplay);
    EXPECT_EQ(result.status, 2);
    EXPECT_EQ(result.err, "nib: --lose-context: 'often' is not every:N with N from 1\n");
}

TEST(SecondProcess, CompilesNothing)
{
    TemporaryFolder folder;
    std::map<std::string, std::string> environment = kNoDisplay;
    environment["NIB_LOG"] = "info";
    environment["NIB_CACHE_DIR"] = folder.Path("sdk");
    const std::vector<std::string> command = {"draw", NIB_SAMPLE, "-o", folder.Path("page.png")};
    const NibResult first = RunNib(command, environment);
    EXPECT_EQ(Count(first.err, "attribute = a_position\n"), 1);
    EXPECT_EQ(Count(first.err, " - Binary shader exists in cache\n"), 0);
    const NibResult second = RunNib(command, environment);
    EXPECT_EQ(Count(second.err, "attribute = "), 0);
    EXPECT_EQ(Count(second.err, " - Binary shader exists in cache\n"), 1);
}

} // namespace
