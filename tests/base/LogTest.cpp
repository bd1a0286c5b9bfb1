#include "base/ChildProcess.h"

#include <android/log.h>
#include <android/native_window.h>
#include <gtest/gtest.h>

#include <cerrno>
#include <csignal>
#include <cstdio>

#include <dlfcn.h>

// The simulated driver stands in for the log in this program; these are the base library's own.

namespace
{

template <typename Function>
Function InBaseLibrary(const char* name)
{
    void* library = dlopen("libNibBase.so.1", RTLD_NOW | RTLD_NOLOAD);
    EXPECT_NE(library, nullptr);
    void* function = dlsym(library, name);
    EXPECT_NE(function, nullptr);
    return reinterpret_cast<Function>(function);
}

using Print = int (*)(int, const char*, const char*, ...);
using Assert = void (*)(const char*, const char*, const char*, ...);
using SetGeometry = int32_t (*)(ANativeWindow*, int32_t, int32_t, int32_t);

/// What comes out of @p action with NIB_LOG set to @p level.
ChildResult Logged(const char* level, const std::function<void(Print)>& action)
{
    const Variable variable("NIB_LOG", level);
    return RunInChild([&] { action(InBaseLibrary<Print>("__android_log_print")); });
}

std::string Process(const ChildResult& child)
{
    char number[16];
    std::snprintf(number, sizeof number, "(%5d)", static_cast<int>(child.pid));
    return number;
}

/// One line at each priority.
void PrintAll(Print print)
{
    for (int priority = ANDROID_LOG_VERBOSE; priority <= ANDROID_LOG_FATAL; ++priority)
        print(priority, "t", "x");
}

std::string LettersAt(const char* level)
{
    std::string letters;
    for (const std::string& line : Logged(level, PrintAll).writes)
        letters += line.substr(0, 1);
    return letters;
}

} // namespace

TEST(Log, WritesLogcatsBriefForm)
{
    const ChildResult child = Logged(
        "info", [](Print print) { print(ANDROID_LOG_INFO, "nib_log", "%s Initialize", "f()"); });
    EXPECT_EQ(child.Text(), "I/nib_log " + Process(child) + ": f() Initialize\n");
}

TEST(Log, WritesEachMessageWithOneCall)
{
    const ChildResult child = Logged("debug",
                                     [](Print print)
                                     {
                                         print(ANDROID_LOG_DEBUG, "nib_log", "a %d", 1);
                                         print(ANDROID_LOG_ERROR, "nib_log", "b %s", "two");
                                     });
    ASSERT_EQ(child.writes.size(), 2u);
    EXPECT_EQ(child.writes[0], "D/nib_log " + Process(child) + ": a 1\n");
    EXPECT_EQ(child.writes[1], "E/nib_log " + Process(child) + ": b two\n");
}

TEST(Log, EachLineOfAMessageHasThePrefix)
{
    const ChildResult child =
        Logged("warn", [](Print print) { print(ANDROID_LOG_WARN, "tag", "one\ntwo"); });
    ASSERT_EQ(child.writes.size(), 1u);
    EXPECT_EQ(child.writes[0],
              "W/tag     " + Process(child) + ": one\nW/tag     " + Process(child) + ": two\n");
}

TEST(Log, LongTagsAndMissingOnesAreKept)
{
    const ChildResult child = Logged("warn",
                                     [](Print print)
                                     {
                                         print(ANDROID_LOG_WARN, "a_long_tag_name", "x");
                                         print(ANDROID_LOG_WARN, nullptr, "y");
                                     });
    ASSERT_EQ(child.writes.size(), 2u);
    EXPECT_EQ(child.writes[0], "W/a_long_tag_name" + Process(child) + ": x\n");
    EXPECT_EQ(child.writes[1], "W/        " + Process(child) + ": y\n");
}

TEST(Log, KeepsLongMessages)
{
    const std::string text(3000, 'x');
    const ChildResult child = Logged("warn", [&](Print print)
                                     { print(ANDROID_LOG_WARN, "nib_log", "%s", text.c_str()); });
    EXPECT_EQ(child.Text(), "W/nib_log " + Process(child) + ": " + text + "\n");
}

TEST(Log, TheVariableNamesTheLowestPriority)
{
    EXPECT_EQ(LettersAt("verbose"), "VDIWEF");
    EXPECT_EQ(LettersAt("debug"), "DIWEF");
    EXPECT_EQ(LettersAt("info"), "IWEF");
    EXPECT_EQ(LettersAt("warn"), "WEF");
    EXPECT_EQ(LettersAt("error"), "EF");
    EXPECT_EQ(LettersAt("silent"), "");
}

TEST(Log, ShowsWarningsUnlessTold)
{
    EXPECT_EQ(LettersAt(nullptr), "WEF");
    EXPECT_EQ(LettersAt(""), "WEF");
    EXPECT_EQ(LettersAt("loud"), "WEF");
}

TEST(Log, FormatsNothingThatIsFiltered)
{
    const ChildResult child =
        Logged("warn",
               [](Print print)
               {
                   int written = -1; // by %n, when the text is formatted
                   EXPECT_EQ(print(ANDROID_LOG_INFO, "t", "ab%n", &written), -EPERM);
                   EXPECT_EQ(written, -1);
                   EXPECT_EQ(print(ANDROID_LOG_WARN, "t", "%s", "ab"), 1);
               });
    EXPECT_EQ(child.exitCode, 0) << child.Text();
}

TEST(Log, KeepsErrno)
{
    const ChildResult child = Logged("warn",
                                     [](Print print)
                                     {
                                         errno = ENOENT;
                                         print(ANDROID_LOG_WARN, "t", "x");
                                         print(ANDROID_LOG_INFO, "t", "x");
                                         EXPECT_EQ(errno, ENOENT);
                                     });
    EXPECT_EQ(child.exitCode, 0) << child.Text();
}

TEST(Log, AnAssertionWritesItsMessageAndEndsTheProcess)
{
    const Variable variable("NIB_LOG", "error");
    const ChildResult child = RunInChild(
        []
        { InBaseLibrary<Assert>("__android_log_assert")("cond", "nib_log", "too many: %d", 5); });
    EXPECT_EQ(child.signal, SIGABRT);
    EXPECT_EQ(child.Text(), "F/nib_log " + Process(child) + ": too many: 5\n");
}

TEST(Log, ASilentAssertionEndsTheProcessToo)
{
    const Variable variable("NIB_LOG", "silent");
    const ChildResult child = RunInChild(
        [] { InBaseLibrary<Assert>("__android_log_assert")("cond", "nib_log", "too many"); });
    EXPECT_EQ(child.signal, SIGABRT);
    EXPECT_EQ(child.Text(), "");
}

TEST(NativeWindow, TakesAnyGeometry)
{
    const auto set = InBaseLibrary<SetGeometry>("ANativeWindow_setBuffersGeometry");
    EXPECT_EQ(set(nullptr, 0, 0, 1), 0);
    EXPECT_EQ(set(reinterpret_cast<ANativeWindow*>(0x400001), 640, 480, 4), 0);
}
