#include "thread/TaskMemory.h"

#include <nib/base.h>

#include <atomic>
#include <cstdlib>
#include <new>
#include <utility>

namespace Nib
{

/// Stands at the beginning of the memory that it counts.
class TaskMemory::Slab
{
public:
    static constexpr std::size_t kHeader = kStep;
    // Leaves the C library room for the head of the next allocation, so that slabs lie side by side.
    static constexpr std::size_t kBytes = kSlabAlignment - 2 * sizeof(std::size_t);

    /// Throws std::bad_alloc.
    static Slab* Make()
    {
        void* memory = nullptr;
        if (posix_memalign(&memory, kSlabAlignment, kBytes) != 0)
            throw std::bad_alloc();
        return new (memory) Slab;
    }
    static void Destroy(Slab* slab) noexcept
    {
        slab->~Slab();
        std::free(slab);
    }

    /// Begins to be cut into blocks of @p size; returns how many there are. All of them count as in
    /// use from now on.
    std::size_t Cut(std::size_t size) noexcept
    {
        const std::size_t blocks = (kBytes - kHeader) / size;
        m_inUse.store(static_cast<int>(blocks), std::memory_order_relaxed); // published by the task
        return blocks;
    }
    std::byte* FirstBlock() { return reinterpret_cast<std::byte*>(this) + kHeader; }

    /// True when no other block is in use. Release, so that whoever cuts the slab again does so
    /// behind all that was done with these blocks; acquire, to be that one.
    bool Return(int blocks) noexcept
    {
        return m_inUse.fetch_sub(blocks, std::memory_order_acq_rel) == blocks;
    }

private:
    friend class Depot;

    std::atomic<int> m_inUse{0};
    Slab* m_nextFree = nullptr; // those below belong to the depot
    Slab* m_before = nullptr;
    Slab* m_after = nullptr;
};

/// All slabs there are, and among them those that nobody uses. Usable until the very end of the
/// process, like the lock that it holds.
class TaskMemory::Depot
{
public:
    /// A free slab, or a new one. Throws std::bad_alloc.
    static Slab* Take()
    {
        {
            AutoCriticalSection lock(s_lock);
            if (Slab* const slab = s_free)
            {
                s_free = slab->m_nextFree;
                --s_freeCount;
                return slab;
            }
        }
        Slab* const slab = Slab::Make();
        AutoCriticalSection lock(s_lock);
        slab->m_after = s_all;
        if (s_all)
            s_all->m_before = slab;
        s_all = slab;
        return slab;
    }

    /// Takes back @p slab, no block of which is in use.
    static void Put(Slab* slab) noexcept
    {
        {
            AutoCriticalSection lock(s_lock);
            if ((s_freeCount + 1) * kSlabAlignment <= kMostInDepot)
            {
                slab->m_nextFree = std::exchange(s_free, slab);
                ++s_freeCount;
                return;
            }
            (slab->m_before ? slab->m_before->m_after : s_all) = slab->m_after;
            if (slab->m_after)
                slab->m_after->m_before = slab->m_before;
        }
        Slab::Destroy(slab);
    }

    static bool Has(const Slab* slab) noexcept
    {
        AutoCriticalSection lock(s_lock);
        const Slab* known = s_all;
        while (known && known != slab)
            known = known->m_after;
        return known != nullptr;
    }

    /// Tells @p slab of blocks that are no longer in use.
    static void Return(Slab* slab, int blocks) noexcept
    {
        if (blocks > 0 && slab->Return(blocks))
            Put(slab);
    }

private:
    static CriticalSection s_lock;
    static Slab* s_all;
    static Slab* s_free;
    static std::size_t s_freeCount;
};

constinit CriticalSection TaskMemory::Depot::s_lock{false};
constinit TaskMemory::Slab* TaskMemory::Depot::s_all = nullptr;
constinit TaskMemory::Slab* TaskMemory::Depot::s_free = nullptr;
constinit std::size_t TaskMemory::Depot::s_freeCount = 0;
constinit thread_local TaskMemory::Supply TaskMemory::t_supplies[kClasses];
constinit thread_local TaskMemory::Returns TaskMemory::t_returns[kReturns];
constinit thread_local TaskMemory::Use TaskMemory::t_use = Use::Untouched;

/// Tells the slabs what the calling thread has not, when it ends. Tasks that end later still, with
/// other things of the thread, are told one by one.
struct TaskMemory::EndOfThread
{
    ~EndOfThread()
    {
        t_use = Use::ThreadEnded;
        for (Supply& supply : t_supplies)
        {
            if (const std::size_t left = std::exchange(supply.left, 0))
                Depot::Return(SlabOf(supply.next), static_cast<int>(left));
        }
        for (Returns& returns : t_returns)
            Depot::Return(std::exchange(returns.slab, nullptr), std::exchange(returns.count, 0));
    }
};

/// Whether the calling thread may keep something until it ends.
bool TaskMemory::IsOpen()
{
    if (t_use == Use::Untouched)
    {
        static thread_local EndOfThread end;
        static_cast<void>(&end);
        t_use = Use::Open;
    }
    return t_use == Use::Open;
}

void* TaskMemory::AllocateLarge(std::size_t size)
{
    return ::operator new(size);
}

void TaskMemory::FreeLarge(void* memory) noexcept
{
    ::operator delete(memory);
}

void TaskMemory::FreeUnsized(void* memory) noexcept
{
    Slab* const slab = SlabOf(memory);
    if (Depot::Has(slab))
        Depot::Return(slab, 1);
    else
        FreeLarge(memory);
}

/// The thread has nothing left to cut: begins another slab.
void TaskMemory::Refill(std::size_t index)
{
    Supply& supply = t_supplies[index];
    Slab* const slab = Depot::Take();
    const std::size_t blocks = slab->Cut(SizeOf(index));
    supply.next = slab->FirstBlock();
    supply.left = blocks;
    if (!IsOpen()) // one block is taken now, the others never are
        Depot::Return(slab, static_cast<int>(std::exchange(supply.left, 1)) - 1);
}

/// The block is of another slab than those before it: tells that one, and counts for this one.
void TaskMemory::FreeElsewhere(Slab* slab) noexcept
{
    if (!IsOpen())
        return Depot::Return(slab, 1);
    Returns& returns = ReturnsOf(slab);
    Depot::Return(std::exchange(returns.slab, slab), std::exchange(returns.count, 1));
}

} // namespace Nib
