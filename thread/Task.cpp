#include <nib/task.h>

namespace Nib
{

ITask::~ITask() = default;

bool ITask::isGlobalLockAllowed()
{
    return true;
}

} // namespace Nib
