#include "base/ChildProcess.h"

#include <nib/base.h>

#include <gtest/gtest.h>

#include <cstdlib>
#include <thread>
#include <vector>

using namespace Nib;

// What the environment says is read once, so each case is a process of its own.

namespace
{

/// The environment of a user who has set nothing.
class SystemTest : public testing::Test
{
protected:
    void InChild(const std::function<void()>& action)
    {
        const ChildResult child = RunInChild(action);
        EXPECT_EQ(child.exitCode, 0) << child.Text();
    }

    TemporaryFolder folder;
    Variable sdk{"NIB_SDK_VERSION", nullptr};
    Variable type{"NIB_BUILD_TYPE", nullptr};
    Variable cache{"NIB_CACHE_DIR", nullptr};
    Variable desktop{"NIB_DESKTOP", nullptr};
    Variable caches{"XDG_CACHE_HOME", nullptr};
    Variable home{"HOME", folder.Path().c_str()};
};

} // namespace

TEST_F(SystemTest, DefaultsWithoutAnyVariable)
{
    InChild(
        []
        {
            EXPECT_EQ(System::GetSDKVersion(), 34);
            EXPECT_FALSE(System::IsBuildTypeEngMode());
            EXPECT_TRUE(System::GetDesktopFallbacks());
        });
}

TEST_F(SystemTest, TheEnvironmentGivesTheSdkVersion)
{
    const Variable set("NIB_SDK_VERSION", "28");
    InChild([] { EXPECT_EQ(System::GetSDKVersion(), 28); });
}

TEST_F(SystemTest, WhatIsNoNumberIsNoSdkVersion)
{
    for (const char* text : {"", "abc", "28x", " 28", "99999999999"})
    {
        const Variable set("NIB_SDK_VERSION", text);
        InChild([] { EXPECT_EQ(System::GetSDKVersion(), 34); });
    }
}

TEST_F(SystemTest, OnlyEngTurnsEngineeringModeOn)
{
    {
        const Variable set("NIB_BUILD_TYPE", "eng");
        InChild([] { EXPECT_TRUE(System::IsBuildTypeEngMode()); });
    }
    for (const char* text : {"user", "userdebug", "ENG", "english"})
    {
        const Variable set("NIB_BUILD_TYPE", text);
        InChild([] { EXPECT_FALSE(System::IsBuildTypeEngMode()); });
    }
}

TEST_F(SystemTest, ZeroTurnsDesktopFallbacksOff)
{
    const std::vector<std::pair<const char*, bool>> cases = {
        {"0", false}, {"1", true}, {"", true}, {"no", true}};
    for (const auto& [text, on] : cases)
    {
        const Variable set("NIB_DESKTOP", text);
        InChild([expected = on] { EXPECT_EQ(System::GetDesktopFallbacks(), expected); });
    }
}

TEST_F(SystemTest, TheCacheIsInTheHomeFolder)
{
    InChild(
        [&]
        {
            EXPECT_EQ(System::GetSDKCacheDirectoryPath(), folder / ".cache/nib/sdk");
            EXPECT_TRUE(IsFolder(folder / ".cache/nib"));
            EXPECT_FALSE(IsFolder(folder / ".cache/nib/sdk"));
        });
}

TEST_F(SystemTest, TheCacheFolderOfTheUserGoesFirst)
{
    const Variable set("XDG_CACHE_HOME", (folder / "caches").c_str());
    InChild(
        [&]
        {
            EXPECT_EQ(System::GetSDKCacheDirectoryPath(), folder / "caches/nib/sdk");
            EXPECT_TRUE(IsFolder(folder / "caches/nib"));
        });
}

TEST_F(SystemTest, TheCacheFolderOfThisLibraryGoesBeforeAll)
{
    const Variable both("XDG_CACHE_HOME", (folder / "caches").c_str());
    const Variable set("NIB_CACHE_DIR", (folder / "deep/own/").c_str());
    InChild(
        [&]
        {
            EXPECT_EQ(System::GetSDKCacheDirectoryPath(), folder / "deep/own/");
            EXPECT_TRUE(IsFolder(folder / "deep/own"));
            EXPECT_FALSE(IsFolder(folder / "caches"));
        });
}

TEST_F(SystemTest, WithoutAHomeThereIsNoCache)
{
    const Variable set("HOME", nullptr);
    InChild([] { EXPECT_EQ(System::GetSDKCacheDirectoryPath(), nullptr); });
}

TEST_F(SystemTest, NoFolderIsMadeBeforeItIsAskedFor)
{
    InChild(
        [&]
        {
            System::GetSDKVersion();
            EXPECT_FALSE(IsFolder(folder / ".cache"));
        });
}

TEST_F(SystemTest, TheEnvironmentIsReadAtTheFirstUseOfAnyOperation)
{
    InChild(
        []
        {
            System::SetBuildTypeEngMode(true); // a setter is a use as well
            setenv("NIB_SDK_VERSION", "23", 1);
            setenv("NIB_DESKTOP", "0", 1);
            setenv("NIB_CACHE_DIR", "/elsewhere/sdk", 1);
            EXPECT_EQ(System::GetSDKVersion(), 34);
            EXPECT_TRUE(System::GetDesktopFallbacks());
            EXPECT_STRNE(System::GetSDKCacheDirectoryPath(), "/elsewhere/sdk");
        });
}

TEST_F(SystemTest, TheApplicationHasTheLastWord)
{
    const Variable version("NIB_SDK_VERSION", "28");
    const Variable off("NIB_DESKTOP", "0");
    InChild(
        []
        {
            System::SetSDKVersion(30);
            System::SetBuildTypeEngMode(true);
            System::SetDesktopFallbacks(true);
            System::SetSDKCacheDirectoryPath("/data/x/cache/sdk");
            EXPECT_EQ(System::GetSDKVersion(), 30);
            EXPECT_TRUE(System::IsBuildTypeEngMode());
            EXPECT_TRUE(System::GetDesktopFallbacks());
            EXPECT_STREQ(System::GetSDKCacheDirectoryPath(), "/data/x/cache/sdk");

            System::SetBuildTypeEngMode(false);
            System::SetDesktopFallbacks(false);
            EXPECT_FALSE(System::IsBuildTypeEngMode());
            EXPECT_FALSE(System::GetDesktopFallbacks());
        });
}

TEST_F(SystemTest, ACachePathIsCopiedAndStaysValid)
{
    InChild(
        [&]
        {
            char path[] = "/first/sdk";
            System::SetSDKCacheDirectoryPath(path);
            path[1] = 'X';
            const char* first = System::GetSDKCacheDirectoryPath();
            System::SetSDKCacheDirectoryPath("/second/sdk");
            EXPECT_STREQ(first, "/first/sdk");
            EXPECT_STREQ(System::GetSDKCacheDirectoryPath(), "/second/sdk");

            System::SetSDKCacheDirectoryPath(nullptr);
            EXPECT_EQ(System::GetSDKCacheDirectoryPath(), nullptr);
            EXPECT_FALSE(IsFolder(folder / ".cache")); // the default was never used
        });
}

TEST_F(SystemTest, SeveralThreadsMayAskAndSet)
{
    std::vector<std::thread> threads;
    for (int i = 0; i < 4; ++i)
    {
        threads.emplace_back(
            [i]
            {
                for (int n = 0; n < 500; ++n)
                {
                    System::SetSDKVersion(20 + i);
                    System::SetSDKCacheDirectoryPath(i % 2 ? "/a/sdk" : "/b/sdk");
                    const int version = System::GetSDKVersion();
                    EXPECT_TRUE(version >= 20 && version < 24);
                    const std::string path = System::GetSDKCacheDirectoryPath();
                    EXPECT_TRUE(path == "/a/sdk" || path == "/b/sdk");
                }
            });
    }
    for (std::thread& thread : threads)
        thread.join();
}
