#include "base/Folders.h"
#include "base/SystemDefaults.h"

#include <nib/base.h>

#include <charconv>
#include <cstring>
#include <mutex>
#include <set>

namespace Nib
{

namespace
{

// Made at the first use of any operation, never destroyed: threads may ask until the very end.
struct State
{
    SystemDefaults defaults = ReadSystemDefaults();

    std::atomic<int> sdkVersion{defaults.sdkVersion};
    std::atomic<bool> engMode{defaults.engMode};
    std::atomic<bool> desktopFallbacks{defaults.desktopFallbacks};

    std::mutex cacheMutex;
    bool cacheParentsPending = defaults.cacheDirectory.has_value();
    std::set<std::string> cacheDirectories; // every one given out: their texts stay valid
    const char* cacheDirectory = nullptr;

    State()
    {
        if (defaults.cacheDirectory)
            UseCacheDirectory(defaults.cacheDirectory->c_str());
    }

    void UseCacheDirectory(const char* path)
    {
        cacheDirectory = path ? cacheDirectories.emplace(path).first->c_str() : nullptr;
    }
};

State& TheState()
{
    static State* const state = new State;
    return *state;
}

} // namespace

int System::GetSDKVersion()
{
    return TheState().sdkVersion.load(std::memory_order_relaxed);
}

void System::SetSDKVersion(int version)
{
    TheState().sdkVersion.store(version, std::memory_order_relaxed);
}

bool System::IsBuildTypeEngMode()
{
    return TheState().engMode.load(std::memory_order_relaxed);
}

void System::SetBuildTypeEngMode(bool on)
{
    TheState().engMode.store(on, std::memory_order_relaxed);
}

const char* System::GetSDKCacheDirectoryPath()
{
    State& state = TheState();
    const std::lock_guard lock(state.cacheMutex);
    if (state.cacheParentsPending)
    {
        state.cacheParentsPending = false;
        MakeParentFolders(state.cacheDirectory);
    }
    return state.cacheDirectory;
}

void System::SetSDKCacheDirectoryPath(const char* path)
{
    State& state = TheState();
    const std::lock_guard lock(state.cacheMutex);
    state.cacheParentsPending = false;
    state.UseCacheDirectory(path);
}

bool System::GetDesktopFallbacks()
{
    return TheState().desktopFallbacks.load(std::memory_order_relaxed);
}

void System::SetDesktopFallbacks(bool on)
{
    TheState().desktopFallbacks.store(on, std::memory_order_relaxed);
}

int NumberOr(const char* text, int otherwise)
{
    if (!text)
        return otherwise;
    const char* end = text + std::strlen(text);
    int number = 0;
    const auto [stop, error] = std::from_chars(text, end, number);
    return error == std::errc() && stop == end ? number : otherwise;
}

bool SwitchOr(const char* text, bool otherwise)
{
    if (text && std::strcmp(text, "0") == 0)
        return false;
    if (text && std::strcmp(text, "1") == 0)
        return true;
    return otherwise;
}

} // namespace Nib
