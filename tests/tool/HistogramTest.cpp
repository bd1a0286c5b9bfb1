#include "latency/Histogram.h"

#include <gtest/gtest.h>
#include <numeric>
#include <utility>

namespace
{

LatencySeries Series(std::vector<float> times)
{
    LatencySeries series;
    series.times = std::move(times);
    return series;
}

TEST(Histogram, SortsTimesIntoBinsOfARoundWidth)
{
    const Histogram histogram({Series({0.0f, 1.5f, 1.9f, 2.1f, 59.0f})});
    EXPECT_FLOAT_EQ(histogram.BinWidth(), 1.0f);
    EXPECT_EQ(histogram.BinCount(), 60);
    EXPECT_EQ(histogram.Counts(0)[0], 1);
    EXPECT_EQ(histogram.Counts(0)[1], 2);
    EXPECT_EQ(histogram.Counts(0)[2], 1);
    EXPECT_EQ(histogram.Counts(0)[59], 1);
    EXPECT_EQ(histogram.Largest(), 2);
}

TEST(Histogram, WidthsAreOneTwoOrFiveTimesAPowerOfTen)
{
    struct Row
    {
        float longest, width;
    };
    const Row rows[] = {{0.5f, 0.01f}, {3.0f, 0.05f}, {6.0f, 0.1f},   {7.0f, 0.2f},
                        {13.0f, 0.5f}, {31.0f, 1.0f}, {100.0f, 2.0f}, {5000.0f, 100.0f}};
    for (const Row& row : rows)
        EXPECT_FLOAT_EQ(Histogram({Series({row.longest})}).BinWidth(), row.width) << row.longest;
}

TEST(Histogram, SeriesShareTheirBins)
{
    const Histogram histogram({Series({5.0f}), Series({50.0f, 50.0f, 50.0f}), Series({})});
    EXPECT_FLOAT_EQ(histogram.BinWidth(), 1.0f);
    EXPECT_EQ(histogram.BinCount(), 51);
    EXPECT_EQ(histogram.Largest(), 3);
    EXPECT_EQ(histogram.Counts(0)[5], 1);
    EXPECT_EQ(histogram.Counts(1)[50], 3);
    EXPECT_EQ(std::accumulate(histogram.Counts(2).begin(), histogram.Counts(2).end(), 0), 0);
}

TEST(Histogram, TheLastBinHoldsWhatLiesBeyond)
{
    std::vector<float> times(100, 0.25f);
    times.insert(times.end(), 98, 0.5f); // the 99th percentile
    times.insert(times.end(), {3.0f, 400.0f});
    const Histogram histogram({Series(times)});
    EXPECT_FLOAT_EQ(histogram.BinWidth(), 0.01f);
    EXPECT_LT(histogram.BinCount(), 60);
    EXPECT_EQ(histogram.Counts(0).back(), 100);
    EXPECT_EQ(histogram.Largest(), 100);
}

} // namespace
