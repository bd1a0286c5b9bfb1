#include <nib/version.h>

#include <gtest/gtest.h>

#include <string>

TEST(Version, LibraryAndHeadersAgreeWhenBuiltTogether)
{
    EXPECT_STREQ(Nib::GetVersionString(), NIB_VERSION_STRING);
}

TEST(Version, TextHoldsTheThreeNumbers)
{
    const std::string expected = std::to_string(NIB_VERSION_MAJOR) + "." +
                                 std::to_string(NIB_VERSION_MINOR) + "." +
                                 std::to_string(NIB_VERSION_PATCH);
    EXPECT_EQ(NIB_VERSION_STRING, expected);
}

TEST(Version, NumbersCompareInThePreprocessor)
{
#if NIB_VERSION < NIB_VERSION_NUMBER(1, 0, 0) || NIB_VERSION >= NIB_VERSION_NUMBER(2, 0, 0)
    FAIL() << NIB_VERSION;
#endif
    EXPECT_LT(NIB_VERSION_NUMBER(1, 2, 99), NIB_VERSION_NUMBER(1, 3, 0));
    EXPECT_LT(NIB_VERSION_NUMBER(1, 99, 99), NIB_VERSION_NUMBER(2, 0, 0));
}
