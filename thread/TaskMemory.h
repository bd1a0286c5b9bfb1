#ifndef NIB_THREAD_TASK_MEMORY_H
#define NIB_THREAD_TASK_MEMORY_H

#include <cstddef>

#if defined(__SANITIZE_ADDRESS__)
#define NIB_ADDRESS_SANITIZER 1
#elif defined(__has_feature)
#if __has_feature(address_sanitizer)
#define NIB_ADDRESS_SANITIZER 1
#endif
#endif

namespace Nib
{

/// Memory for tasks, which are made on one thread and deleted on another all day long. Each thread
/// keeps the blocks that it freed, by size; what becomes too much goes in batches to a depot, from
/// which threads that have none take them. So in the long run no task costs an allocation.
///
/// Blocks are allocated one by one and given back when the depot is full. Large tasks go past it,
/// and under an address sanitizer all do, so that it sees their misuse.
class TaskMemory
{
public:
    /// Any thread. Throws std::bad_alloc.
    static void* Allocate(std::size_t size)
    {
        const std::size_t index = ClassOf(size);
        if (index >= kClasses)
            return AllocateLarge(size);
        Shelf& shelf = t_shelves[index];
        if (shelf.first == nullptr)
            return Refill(index);
        Block* const block = shelf.first;
        shelf.first = block->next;
        --shelf.count;
        return block;
    }

    /// Any thread, also another one than that which allocated; @p size as then.
    static void Free(void* memory, std::size_t size) noexcept
    {
        const std::size_t index = ClassOf(size);
        if (index >= kClasses)
            return FreeLarge(memory);
        Shelf& shelf = t_shelves[index];
        if (shelf.count >= kMostOnShelf)
            return Spill(index, memory);
        Block* const block = static_cast<Block*>(memory);
        block->next = shelf.first;
        shelf.first = block;
        ++shelf.count;
    }

private:
    class Depot;
    struct EndOfThread;

    struct Block
    {
        Block* next;
        Block* nextBatch; ///< of the first block of a batch that lies in the depot
    };

    static constexpr std::size_t kStep = 32; // bytes from one size to the next
    static constexpr std::size_t kClasses = 8;
    static constexpr int kBatch = 32;
    static constexpr int kMostOnShelf = 2 * kBatch;
    // Counts of shelves that are not in use; larger than all others.
    static constexpr int kUntouched = kMostOnShelf + 1;
    static constexpr int kThreadEnded = kMostOnShelf + 2;
    static constexpr std::size_t kMostInDepot = std::size_t{8} << 20; // bytes of each size

    static_assert(sizeof(Block) <= kStep);

    /// A thread's own blocks of one size.
    struct Shelf
    {
        Block* first = nullptr;
        int count = kUntouched;
    };

#if defined(NIB_ADDRESS_SANITIZER)
    static std::size_t ClassOf(std::size_t)
    {
        return kClasses;
    }
#else
    static std::size_t ClassOf(std::size_t size)
    {
        return (size - 1) / kStep;
    }
#endif
    static std::size_t SizeOf(std::size_t index)
    {
        return (index + 1) * kStep;
    }

    static void* AllocateLarge(std::size_t size);
    static void FreeLarge(void* memory) noexcept;
    static void* Refill(std::size_t index);
    static void Spill(std::size_t index, void* memory) noexcept;
    static void Touch(Shelf& shelf);
    static void GiveBatch(Shelf& shelf, std::size_t index) noexcept;
    static void FreeBlocks(Block* block) noexcept;

    // Initialised at build time and without destructor: nothing to check at each use. EndOfThread
    // empties them.
    static thread_local Shelf t_shelves[kClasses];
};

} // namespace Nib

#endif
