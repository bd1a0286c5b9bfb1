#include "AllocationCount.h"
#include "OnRenderThread.h"

#include <gtest/gtest.h>

namespace
{

constexpr int kTimes = 100;

/// Of so many rounds of a path, the first not among them.
long AllocationsOf(HotPath::Function path)
{
    long allocations = -1;
    OnRenderThread(
        [&](HotScene& scene)
        {
            path(scene, 1);
            const long before = AllocationsSoFar();
            path(scene, kTimes);
            allocations = AllocationsSoFar() - before;
        });
    return allocations;
}

} // namespace

TEST(Allocations, AreCounted)
{
    EXPECT_GE(AllocationsOf(&HotPaths::Program), kTimes) << "each program is an object";
}

TEST(Allocations, ADrawMakesNone)
{
    EXPECT_EQ(AllocationsOf(&HotPaths::Draw), 0);
}

TEST(Allocations, StoringAndRestoringTheStateMakesNone)
{
    EXPECT_EQ(AllocationsOf(&HotPaths::State), 0);
}

TEST(Allocations, PixelsForATextureMakeNone)
{
    EXPECT_EQ(AllocationsOf(&HotPaths::Update), 0);
    EXPECT_EQ(AllocationsOf(&HotPaths::SetData), 0);
}

TEST(Allocations, PixelsReadBackMakeNone)
{
    EXPECT_EQ(AllocationsOf(&HotPaths::ReadPixels), 0);
}

TEST(Allocations, AFramePresentedInPartMakesNone)
{
    EXPECT_EQ(AllocationsOf(&HotPaths::Present), 0);
    EXPECT_EQ(AllocationsOf(&HotPaths::TiledPresent), 0);
}

TEST(Allocations, ALogLineThatNobodyWantsMakesNone)
{
    EXPECT_EQ(AllocationsOf(&HotPaths::Filtered), 0);
}
