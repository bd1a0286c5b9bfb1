#include "device/CheckTask.h"

#include <nib/msg_queue.h>
#include <nib/task.h>

namespace Nib
{

void RunCheck(IGLMsgQueue& queue, void (*check)(bool*), bool* result)
{
    ITask* task = new WorkerTask::Func1<void (*)(bool*), bool*>(check, result);
    if (!queue.enQueueMsg(task))
        delete task; // a task that was taken belongs to the queue
    queue.waitForCompleting();
}

} // namespace Nib
