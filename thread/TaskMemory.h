#ifndef NIB_THREAD_TASK_MEMORY_H
#define NIB_THREAD_TASK_MEMORY_H

#include <cstddef>
#include <cstdint>

#if defined(__SANITIZE_ADDRESS__)
#define NIB_ADDRESS_SANITIZER 1
#elif defined(__has_feature)
#if __has_feature(address_sanitizer)
#define NIB_ADDRESS_SANITIZER 1
#endif
#endif

namespace Nib
{

/// Memory for tasks, which are made on one thread and deleted on another all day long.
///
/// It is cut from slabs. A thread cuts the blocks of one size from a slab of its own, one behind the
/// other, so that tasks lie in the order in which they were made, which is the order in which they
/// are read; a thread that frees only counts. A slab of which every block is free goes to the depot,
/// from which all threads take. So in the long run no task costs an allocation, and a thread meets
/// others once in a slab, not once in a task.
///
/// A block is not used again before its whole slab is free: tasks that are kept for long keep theirs.
/// Large tasks come from the heap, and under an address sanitizer all do, so that it sees their
/// misuse.
class TaskMemory
{
public:
    /// Any thread. Throws std::bad_alloc.
    static void* Allocate(std::size_t size)
    {
        const std::size_t index = ClassOf(size);
        if (index >= kClasses)
            return AllocateLarge(size);
        Supply& supply = t_supplies[index];
        if (supply.left == 0)
            Refill(index);
        --supply.left;
        std::byte* const block = supply.next;
        supply.next = block + SizeOf(index);
        return block;
    }

    /// Any thread, also another one than that which allocated; @p size as then.
    static void Free(void* memory, std::size_t size) noexcept
    {
        if (ClassOf(size) >= kClasses)
            return FreeLarge(memory);
        Slab* const slab = SlabOf(memory);
        Returns& returns = ReturnsOf(slab);
        if (returns.slab != slab)
            return FreeElsewhere(slab);
        ++returns.count;
    }

    /// The same where the size is not known. Slow.
    static void FreeUnsized(void* memory) noexcept;

private:
    class Depot;
    class Slab;
    struct EndOfThread;

    static constexpr std::size_t kStep = 64; // from one size to the next: lines are not shared
    static constexpr std::size_t kClasses = 4;
    static constexpr std::size_t kSlabAlignment = 8192;
    static constexpr std::size_t kMostInDepot = std::size_t{8} << 20; // bytes
    static constexpr std::size_t kReturns = 4;

    /// What a thread has not cut yet of its slab of one size.
    struct Supply
    {
        std::byte* next = nullptr;
        std::size_t left = 0;
    };

    /// How many blocks of a slab a thread has freed without telling the slab. One of another slab
    /// that has to be noted in the same place tells it.
    struct Returns
    {
        Slab* slab = nullptr;
        int count = 0;
    };

    enum class Use
    {
        Untouched,
        Open,
        ThreadEnded,
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
    static Slab* SlabOf(void* memory)
    {
        const auto inSlab = reinterpret_cast<std::uintptr_t>(memory) % kSlabAlignment;
        return reinterpret_cast<Slab*>(static_cast<std::byte*>(memory) - inSlab);
    }
    static Returns& ReturnsOf(const Slab* slab)
    {
        return t_returns[reinterpret_cast<std::uintptr_t>(slab) / kSlabAlignment % kReturns];
    }

    static void* AllocateLarge(std::size_t size);
    static void FreeLarge(void* memory) noexcept;
    static void Refill(std::size_t index);
    static void FreeElsewhere(Slab* slab) noexcept;
    static bool IsOpen();

    // Initialised at build time and without destructor: nothing to check at each use. EndOfThread
    // empties them.
    static thread_local Supply t_supplies[kClasses];
    static thread_local Returns t_returns[kReturns];
    static thread_local Use t_use;
};

} // namespace Nib

#endif
