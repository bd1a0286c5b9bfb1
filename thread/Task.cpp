#include <nib/task.h>

#include "thread/TaskMemory.h"

namespace Nib
{

ITask::~ITask() = default;

void* ITask::operator new(std::size_t size)
{
    return TaskMemory::Allocate(size);
}

void ITask::operator delete(void* memory, std::size_t size) noexcept
{
    TaskMemory::Free(memory, size);
}

void* ITask::operator new(std::size_t size, const std::nothrow_t&) noexcept
{
    try
    {
        return TaskMemory::Allocate(size);
    }
    catch (const std::bad_alloc&)
    {
        return nullptr;
    }
}

// After a constructor that threw.
void ITask::operator delete(void* memory, const std::nothrow_t&) noexcept
{
    TaskMemory::FreeUnsized(memory);
}

bool ITask::isGlobalLockAllowed()
{
    return true;
}

} // namespace Nib
