#ifndef NIB_TESTS_SOAK_WORLD_H
#define NIB_TESTS_SOAK_WORLD_H

#include "Pages.h"

#include <atomic>
#include <filesystem>

namespace Soak
{

/// What all families share.
struct World
{
    Pages pages;
    std::filesystem::path cacheFolder; ///< of the program cache
    std::atomic<int> actions{0};       ///< done so far
};

} // namespace Soak

#endif
