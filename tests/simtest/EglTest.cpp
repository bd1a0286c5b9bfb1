#include "sim/SimDriver.h"

#include <gtest/gtest.h>

namespace
{

TEST(SimEgl, ContextIsCurrentOnTheThreadThatMadeItCurrent)
{
    SimDriver driver;
    const SimContext context(driver);

    EXPECT_EQ(eglGetCurrentContext(), context.Handle());
    EXPECT_EQ(driver.CallNames(), Names({"eglGetCurrentContext"}));
    EXPECT_STREQ(reinterpret_cast<const char*>(glGetString(GL_RENDERER)), "Adreno (TM) 640");
}

} // namespace
