#include "oracle/Recorded.h"
#include "oracle/Explore.h"

#include "Recording.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdlib>
#include <filesystem>
#include <ostream>

// The dirty rectangles of real pen strokes, in every update mode, with one to four buffers.

using namespace Oracle;

namespace
{

struct Row
{
    Device device;
    bool isAgeless = false;
    bool isPreserved = false;
};

void PrintTo(const Row& row, std::ostream* out)
{
    *out << NameOf(row.device);
}

class RecordedStrokes : public testing::TestWithParam<Row>
{
};

std::string NameOfRow(const testing::TestParamInfo<Row>& info)
{
    return NameOf(info.param.device);
}

Space SpaceOf(const Row& row, int buffers)
{
    Space space;
    space.buffers = buffers;
    space.preserved = row.isPreserved;
    space.buffersGetLost = !row.isPreserved;
    space.lostIsZero = row.isAgeless;
    if (row.isAgeless)
        space.maxAge = 4;
    return space;
}

/// What differs between partial and full update of the strokes in this file; nothing, it is hoped.
std::string Difference(Player& player, const Row& row, const std::string& path, int samplesPerFrame,
                       int buffers)
{
    Scenario scenario = FromRecording(path, samplesPerFrame);
    scenario.rotation = buffers % 4;
    RandomScenario(static_cast<std::uint32_t>(buffers))
        .GiveBuffers(SpaceOf(row, buffers), scenario);
    const std::string found = Judge(player, scenario, "Recorded");
    return found.empty() ? found : path + found;
}

/// The recordings below a folder; what is no recording is left out.
std::vector<std::string> RecordingsIn(const std::string& folder)
{
    std::vector<std::string> paths;
    for (const auto& entry : std::filesystem::recursive_directory_iterator(folder))
    {
        const std::string extension = entry.path().extension().string();
        if (extension == ".dat" || extension == ".svc" || extension == ".json" ||
            extension == ".txt" || extension == ".inkml")
            paths.push_back(entry.path().string());
    }
    std::sort(paths.begin(), paths.end());
    return paths;
}

} // namespace

TEST_P(RecordedStrokes, OwnSampleShowsWhatDrawingInFullShows)
{
    Player player(GetParam().device);

    for (int buffers = 1; buffers <= 4; ++buffers)
        EXPECT_EQ(Difference(player, GetParam(), NIB_SAMPLE, 4, buffers), "");
}

TEST_P(RecordedStrokes, OfOthersShowWhatDrawingInFullShows)
{
    const char* const folder = std::getenv("NIB_STROKES");
    if (folder == nullptr)
        GTEST_SKIP() << "NIB_STROKES names no folder of recordings";
    Player player(GetParam().device);
    const std::vector<std::string> paths = RecordingsIn(folder);
    ASSERT_FALSE(paths.empty()) << folder;

    // One number of buffers for each file, all of them where more runs are asked for.
    const bool isThorough = std::getenv("NIB_ORACLE_RUNS") != nullptr;
    for (std::size_t i = 0; i < 4 * paths.size(); ++i)
    {
        const std::string& path = paths[i / 4];
        if (!isThorough && i % 4 != i / 4 % 4)
            continue;
        const bool isLong = std::filesystem::file_size(path) > 20000;
        EXPECT_EQ(
            Difference(player, GetParam(), path, isLong ? 32 : 4, 1 + static_cast<int>(i % 4)), "");
    }
}

INSTANTIATE_TEST_SUITE_P(Modes, RecordedStrokes,
                         testing::Values(Row{Device::PostSubBuffer}, Row{Device::DamageRegion},
                                         Row{Device::TileAligned}, Row{Device::TiledRendering},
                                         Row{Device::TiledRenderingNoAge, true},
                                         Row{Device::Preserved, false, true},
                                         Row{Device::FullScreen}),
                         NameOfRow);

TEST(Recorded, FrameHoldsTheRectanglesOfItsSamples)
{
    const Scenario scenario = FromRecording(NIB_SAMPLE, 4);

    ASSERT_GT(scenario.frames.size(), 20u);
    EXPECT_TRUE(scenario.frames[0].dirty.empty());
    for (std::size_t i = 1; i + 1 < scenario.frames.size(); ++i)
        EXPECT_EQ(scenario.frames[i].dirty.size(), 4u);
}

TEST(Recorded, StrokesFillThePage)
{
    Nib::RectF bounds;
    for (const Frame& frame : FromRecording(NIB_SAMPLE, 4).frames)
    {
        for (const Nib::RectF& rect : frame.dirty)
            bounds.Union(rect);
    }

    // Half a line's width beyond the page; one of the two sides may be shorter.
    EXPECT_FLOAT_EQ(bounds.left, -0.65F);
    EXPECT_FLOAT_EQ(bounds.top, -0.65F);
    EXPECT_TRUE(std::abs(bounds.right - 100.65F) < 0.01F ||
                std::abs(bounds.bottom - 75.65F) < 0.01F);
}
