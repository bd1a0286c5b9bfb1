// Stands in front of free, on behalf of llvmpipe: a context that writes a resource asks, for each context
// of the process, whether a scene of it uses that resource, and reads the scene's blocks of memory
// while the thread that owns it frees them (Mesa 22.3; docs/reliability.md). A block that was freed is
// therefore kept as it is until many more have been.

#include <array>
#include <atomic>
#include <cstddef>
#include <cstdlib>
#include <cstring>

#include <malloc.h>

// The C library's, behind whatever else is called free.
extern "C" void __libc_free(void* memory); // NOLINT(bugprone-reserved-identifier)

namespace
{

constexpr std::size_t kSceneBlock = 64 * 1024 + 16;          ///< what llvmpipe allocates
constexpr std::size_t kLargestSceneBlock = kSceneBlock + 64; ///< what it may get
constexpr std::size_t kKept = 256; ///< while one is looked at, the other contexts soon have to wait

std::array<std::atomic<void*>, kKept> s_kept{};
std::atomic<std::size_t> s_turn{0};

/// From the start, so that the process does not grow by them.
const bool s_isFilled = []
{
    for (std::atomic<void*>& kept : s_kept)
        kept.store(std::memset(std::malloc(kSceneBlock), 1, kSceneBlock),
                   std::memory_order_relaxed);
    return true;
}();

bool IsSceneBlock(void* memory)
{
    const std::size_t size = malloc_usable_size(memory);
    return size >= kSceneBlock && size <= kLargestSceneBlock;
}

} // namespace

extern "C" __attribute__((visibility("default"))) void free(void* memory) noexcept
{
    if (IsSceneBlock(memory))
    {
        const std::size_t turn = s_turn.fetch_add(1, std::memory_order_relaxed);
        // Release and acquire: the block changes hands, from the thread that frees it to another's.
        memory = s_kept[turn % kKept].exchange(memory, std::memory_order_acq_rel);
    }
    __libc_free(memory);
}
