#include "sim/SimDriver.h"

#include <gtest/gtest.h>

#include <dlfcn.h>
#include <pthread.h>

#include <cerrno>
#include <cstring>

namespace
{

using Getter = int (*)(const char*, char*);

void* Nothing(void*)
{
    return nullptr;
}

TEST(SimSystem, PropertiesAreReachedThroughTheCLibrary)
{
    SimDriver driver;
    driver.SetProperty("ro.sf.hwrotation", "270");
    void* const library = dlopen("libc.so", RTLD_LAZY);
    ASSERT_NE(library, nullptr);
    const auto get = reinterpret_cast<Getter>(dlsym(library, "__system_property_get"));
    ASSERT_NE(get, nullptr);

    char value[92] = "before";
    EXPECT_EQ(get("ro.sf.hwrotation", value), 3);
    EXPECT_STREQ(value, "270");
    EXPECT_EQ(get("ro.missing", value), 0);
    EXPECT_STREQ(value, "");
    dlclose(library);
    EXPECT_EQ(driver.Calls({"dlopen"}), Sequence({Call("dlopen", "libc.so", RTLD_LAZY)}));
}

TEST(SimSystem, TheCLibraryMayBeMissing)
{
    SimDriver driver;
    driver.SetLibc(SimLibc::Missing);

    EXPECT_EQ(dlopen("libc.so", RTLD_LAZY), nullptr);
    EXPECT_NE(dlerror(), nullptr);
}

TEST(SimSystem, TheCLibraryMayLackTheGetter)
{
    SimDriver driver;
    driver.SetLibc(SimLibc::WithoutProperties);
    void* const library = dlopen("libc.so", RTLD_LAZY);
    ASSERT_NE(library, nullptr);

    EXPECT_EQ(dlsym(library, "__system_property_get"), nullptr);
    EXPECT_NE(dlerror(), nullptr);
    dlclose(library);
}

TEST(SimSystem, OtherLibrariesAreTheRealOnes)
{
    SimDriver driver;
    void* const library = dlopen("libm.so.6", RTLD_LAZY);
    ASSERT_NE(library, nullptr);
    EXPECT_NE(dlsym(library, "cos"), nullptr);
    dlclose(library);
    EXPECT_EQ(driver.CallCount(), 0u);
}

TEST(SimSystem, ThreadCreationFailsWhenAskedTo)
{
    SimDriver driver;
    driver.FailNext("pthread_create", EAGAIN);
    pthread_t thread{};

    EXPECT_EQ(pthread_create(&thread, nullptr, Nothing, nullptr), EAGAIN);
    ASSERT_EQ(pthread_create(&thread, nullptr, Nothing, nullptr), 0);
    pthread_join(thread, nullptr);
}

TEST(SimSystem, WindowKeepsItsGeometry)
{
    SimDriver driver;
    ANativeWindow* const window = driver.Window(640, 480);

    EXPECT_EQ(ANativeWindow_setBuffersGeometry(window, 0, 0, 1), 0);

    EXPECT_EQ(driver.WindowState(window).width, 640);
    EXPECT_EQ(driver.WindowState(window).height, 480);
    EXPECT_EQ(driver.WindowState(window).format, 1);
    EXPECT_EQ(driver.WindowState(window).geometryCalls, 1);
    driver.FailNext("ANativeWindow_setBuffersGeometry", 1);
    EXPECT_EQ(ANativeWindow_setBuffersGeometry(window, 0, 0, 1), -1);
}

} // namespace
