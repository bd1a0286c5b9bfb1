#include "base/Spin.h"

#include <gtest/gtest.h>

using namespace Nib;

namespace
{

/// True so many times.
auto For(int turns)
{
    return [turns]() mutable { return turns-- > 0; };
}

} // namespace

TEST(Spin, EndsWhenNothingIsWaitedFor)
{
    EXPECT_TRUE(Spin::While(For(0)));
    EXPECT_TRUE(Spin::While(For(10)));
}

TEST(Spin, EndsAtTheLimit)
{
    const auto begin = std::chrono::steady_clock::now();
    EXPECT_FALSE(Spin::While([] { return true; }));
    EXPECT_GE(std::chrono::steady_clock::now() - begin, std::chrono::microseconds(17));
}

TEST(Spin, TakesNothingFromTheLimitWhenThereIsNoWait)
{
    Spin::Duration left = Spin::kLimit;
    EXPECT_TRUE(Spin::While(For(0), left));
    EXPECT_EQ(left, std::chrono::microseconds(20));
}

TEST(Spin, TakesEachTurnFromTheLimit)
{
    Spin::Duration left = Spin::kLimit;
    EXPECT_TRUE(Spin::While(For(10), left));
    EXPECT_EQ(left, std::chrono::microseconds(19));
    EXPECT_TRUE(Spin::While(For(20), left));
    EXPECT_EQ(left, std::chrono::microseconds(17));
}

TEST(Spin, TakesALongWaitFromTheLimitToo)
{
    Spin::Duration left = std::chrono::seconds(100);
    EXPECT_TRUE(Spin::While(For(100'000), left));
    EXPECT_LT(left, std::chrono::seconds(100) - std::chrono::microseconds(3));
    EXPECT_GT(left, std::chrono::seconds(0));
}

TEST(Spin, LeavesNothingOfALimitThatIsReached)
{
    Spin::Duration left = std::chrono::microseconds(5);
    EXPECT_FALSE(Spin::While([] { return true; }, left));
    EXPECT_EQ(left, Spin::Duration::zero());
}
