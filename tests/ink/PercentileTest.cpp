#include "Percentile.h"

#include <gtest/gtest.h>

#include <numeric>
#include <vector>

namespace Ink
{

TEST(Percentile, IsTheLeastTimeThatSoManyKept)
{
    std::vector<float> times(400); // 400, 399 ... 1
    std::iota(times.rbegin(), times.rend(), 1.0f);
    EXPECT_EQ(Percentile(times, 50), 200.0f);
    EXPECT_EQ(Percentile(times, 95), 380.0f);
    EXPECT_EQ(Percentile(times, 99), 396.0f);
    EXPECT_EQ(Percentile(times, 100), 400.0f);
    EXPECT_EQ(Percentile(times, 0), 1.0f);
}

TEST(Percentile, OfAFewFrames)
{
    EXPECT_EQ(Percentile({7.0f}, 50), 7.0f);
    EXPECT_EQ(Percentile({9.0f, 7.0f}, 50), 7.0f);
    EXPECT_EQ(Percentile({9.0f, 7.0f}, 51), 9.0f);
    EXPECT_EQ(Percentile({}, 50), std::nullopt);
}

} // namespace Ink
