#include "thread/TaskMemory.h"

#include <nib/base.h>

#include <new>
#include <utility>

namespace Nib
{

/// What all threads share of one size: batches of kBatch blocks. Usable until the very end of the
/// process, like the lock that it holds.
class TaskMemory::Depot
{
public:
    static Depot& Of(std::size_t index) { return s_depots[index]; }

    /// Null when there is none.
    Block* Take() noexcept
    {
        AutoCriticalSection lock(m_lock);
        Block* const batch = m_first;
        if (batch)
        {
            m_first = batch->nextBatch;
            --m_count;
        }
        return batch;
    }

    /// False when there are enough.
    bool Put(Block* batch, std::size_t size) noexcept
    {
        AutoCriticalSection lock(m_lock);
        if ((m_count + 1) * kBatch * size > kMostInDepot)
            return false;
        batch->nextBatch = m_first;
        m_first = batch;
        ++m_count;
        return true;
    }

private:
    static Depot s_depots[kClasses];

    CriticalSection m_lock{false};
    Block* m_first = nullptr;
    std::size_t m_count = 0;
};

constinit TaskMemory::Depot TaskMemory::Depot::s_depots[kClasses];
constinit thread_local TaskMemory::Shelf TaskMemory::t_shelves[kClasses];

/// Gives away the calling thread's blocks when the thread ends. Tasks that end later still, with
/// other things of the thread, go past the shelves.
struct TaskMemory::EndOfThread
{
    ~EndOfThread()
    {
        for (std::size_t index = 0; index < kClasses; ++index)
        {
            Shelf& shelf = t_shelves[index];
            if (shelf.count == kUntouched)
                shelf.count = 0;
            while (shelf.count >= kBatch)
                GiveBatch(shelf, index);
            FreeBlocks(std::exchange(shelf.first, nullptr));
            shelf.count = kThreadEnded;
        }
    }
};

/// The first use of a shelf by a thread.
void TaskMemory::Touch(Shelf& shelf)
{
    static thread_local EndOfThread end;
    static_cast<void>(&end);
    shelf.count = 0;
}

void* TaskMemory::AllocateLarge(std::size_t size)
{
    return ::operator new(size);
}

void TaskMemory::FreeLarge(void* memory) noexcept
{
    ::operator delete(memory);
}

/// The thread has no block of that size: a batch from the depot, else a new block.
void* TaskMemory::Refill(std::size_t index)
{
    Shelf& shelf = t_shelves[index];
    if (shelf.count == kUntouched)
        Touch(shelf);
    Block* const batch = shelf.count == kThreadEnded ? nullptr : Depot::Of(index).Take();
    if (batch == nullptr)
        return ::operator new(SizeOf(index));
    shelf.first = batch->next;
    shelf.count = kBatch - 1;
    return batch;
}

/// The shelf of that size takes no more: half of it goes to the depot.
void TaskMemory::Spill(std::size_t index, void* memory) noexcept
{
    Shelf& shelf = t_shelves[index];
    if (shelf.count == kThreadEnded)
        return ::operator delete(memory);
    if (shelf.count == kUntouched)
        Touch(shelf);
    else
        GiveBatch(shelf, index);
    Free(memory, SizeOf(index));
}

void TaskMemory::GiveBatch(Shelf& shelf, std::size_t index) noexcept
{
    Block* const first = shelf.first;
    Block* last = first;
    for (int number = 1; number < kBatch; ++number)
        last = last->next;
    shelf.first = std::exchange(last->next, nullptr);
    shelf.count -= kBatch;
    if (!Depot::Of(index).Put(first, SizeOf(index)))
        FreeBlocks(first);
}

void TaskMemory::FreeBlocks(Block* block) noexcept
{
    while (block)
        ::operator delete(std::exchange(block, block->next));
}

} // namespace Nib
