#include "sim/SimDriver.h"

#include <nib/partial_update.h>

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include <dlfcn.h>

using Nib::android_property_get;

namespace
{

const std::string kSignature = "int Nib::android_property_get(const char *, char *)";

struct Value
{
    int length = -1;
    std::string text;
};

Value Get(const char* name)
{
    char buffer[92] = "not touched";
    Value value;
    value.length = android_property_get(name, buffer);
    value.text = buffer;
    return value;
}

} // namespace

TEST(AndroidProperty, ValueAndLengthAreThoseOfTheSystem)
{
    SimDriver driver;
    driver.SetProperty("ro.sf.hwrotation", "270");

    const Value value = Get("ro.sf.hwrotation");

    EXPECT_EQ(value.length, 3);
    EXPECT_EQ(value.text, "270");
    EXPECT_EQ(driver.Calls("__system_property_get"),
              Sequence({Call("__system_property_get", "ro.sf.hwrotation")}));
    EXPECT_EQ(driver.Log().size(), 0u);
}

TEST(AndroidProperty, AbsentOneIsEmpty)
{
    SimDriver driver;

    const Value value = Get("ro.sf.hwrotation");

    EXPECT_EQ(value.length, 0);
    EXPECT_EQ(value.text, "");
    EXPECT_EQ(driver.Log().size(), 0u);
}

TEST(AndroidProperty, LongestValueFits)
{
    SimDriver driver;
    driver.SetProperty("long", std::string(91, 'x'));

    const Value value = Get("long");

    EXPECT_EQ(value.length, 91);
    EXPECT_EQ(value.text, std::string(91, 'x'));
}

TEST(AndroidProperty, GetterIsResolvedOnce)
{
    SimDriver driver;

    Get("first");
    Get("second");

    EXPECT_EQ(driver.Calls("dlopen"), Sequence({Call("dlopen", "libc.so", RTLD_LAZY)}));
    EXPECT_EQ(driver.CallCount("__system_property_get"), 2u);
}

TEST(AndroidProperty, WithoutTheLibraryBothLinesAreWritten)
{
    SimDriver driver;
    driver.SetLibc(SimLibc::Missing);

    const Value value = Get("ro.sf.hwrotation");

    EXPECT_EQ(value.length, 0);
    EXPECT_EQ(value.text, "");
    // The second time the loader has nothing to say.
    EXPECT_EQ(driver.LogTexts(ANDROID_LOG_ERROR),
              (std::vector<std::string>{
                  kSignature + " - Cannot dlopen libc.so: /no/such/folder/libc.so: "
                               "cannot open shared object file: No such file or directory.\n",
                  kSignature + " - Cannot resolve __system_property_get(): (null).\n"}));
    EXPECT_EQ(driver.CallCount("__system_property_get"), 0u);
}

TEST(AndroidProperty, WithoutTheGetterOneLineIsWritten)
{
    SimDriver driver;
    driver.SetLibc(SimLibc::WithoutProperties);

    const Value value = Get("ro.sf.hwrotation");

    EXPECT_EQ(value.length, 0);
    EXPECT_EQ(value.text, "");
    const std::vector<std::string> lines = driver.LogTexts(ANDROID_LOG_ERROR);
    ASSERT_EQ(lines.size(), 1u);
    const std::string head = kSignature + " - Cannot resolve __system_property_get(): ";
    EXPECT_EQ(lines[0].substr(0, head.size()), head);
    EXPECT_EQ(lines[0].substr(lines[0].size() - 2), ".\n");
}

TEST(AndroidProperty, FailureIsTriedAgain)
{
    SimDriver driver;
    driver.SetProperty("ro.sf.hwrotation", "90");
    driver.SetLibc(SimLibc::Missing);
    EXPECT_EQ(Get("ro.sf.hwrotation").length, 0);
    EXPECT_EQ(Get("ro.sf.hwrotation").length, 0);
    EXPECT_EQ(driver.CallCount("dlopen"), 2u);
    EXPECT_EQ(driver.LogTexts(ANDROID_LOG_ERROR).size(), 4u);

    driver.SetLibc(SimLibc::WithoutProperties);
    EXPECT_EQ(Get("ro.sf.hwrotation").length, 0);
    driver.SetLibc(SimLibc::Complete);

    EXPECT_EQ(Get("ro.sf.hwrotation").text, "90");
    EXPECT_EQ(driver.CallCount("dlopen"), 4u);
}

TEST(AndroidProperty, SuccessIsKept)
{
    SimDriver driver;
    driver.SetProperty("ro.sf.hwrotation", "90");
    EXPECT_EQ(Get("ro.sf.hwrotation").text, "90");

    driver.SetLibc(SimLibc::Missing);

    EXPECT_EQ(Get("ro.sf.hwrotation").text, "90");
    EXPECT_EQ(driver.Log().size(), 0u);
}
