#ifndef NIB_TESTS_SOAK_WORLD_H
#define NIB_TESTS_SOAK_WORLD_H

#include "Pages.h"

#include <atomic>
#include <filesystem>
#include <mutex>

namespace Soak
{

/// What all families share.
struct World
{
    Pages pages;
    std::filesystem::path cacheFolder; ///< of the program cache
    std::atomic<int> actions{0};       ///< done so far
    std::mutex host;                   ///< held by the family that has the process's UI
};

} // namespace Soak

#endif
