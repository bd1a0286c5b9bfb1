#include "sim/SimDriver.h"

#include <gtest/gtest.h>

#include <thread>

namespace
{

TEST(SimLog, LinesKeepPriorityTagTextAndThread)
{
    SimDriver driver;
    __android_log_print(ANDROID_LOG_WARN, "nib_log", "%s = %d ", "x", 5);
    std::thread([] { __android_log_print(ANDROID_LOG_INFO, "nib_log", "other"); }).join();

    const std::vector<SimLogLine> log = driver.Log();
    ASSERT_EQ(log.size(), 2u);
    EXPECT_EQ(log[0].priority, ANDROID_LOG_WARN);
    EXPECT_EQ(log[0].tag, "nib_log");
    EXPECT_EQ(log[0].text, "x = 5 ");
    EXPECT_EQ(log[0].thread, SimDriver::ThisThread());
    EXPECT_NE(log[1].thread, SimDriver::ThisThread());
    EXPECT_TRUE(driver.HasLog(ANDROID_LOG_WARN, "x = 5 "));
    EXPECT_FALSE(driver.HasLog(ANDROID_LOG_WARN, "x = 5"));
    EXPECT_FALSE(driver.HasLog(ANDROID_LOG_INFO, "x = 5 "));
    EXPECT_EQ(driver.CountLogContaining("x = "), 1u);
    EXPECT_EQ(driver.LogTexts(ANDROID_LOG_INFO), std::vector<std::string>{"other"});
    driver.ForgetLog();
    EXPECT_TRUE(driver.Log().empty());
}

TEST(SimLogDeathTest, AnAssertionEndsTheProcess)
{
    SimDriver driver;
    EXPECT_DEATH(__android_log_assert("cond", "nib_log", "limit %i", 5), "nib_log: cond: limit 5");
}

} // namespace
