#include <nib/msg_queue.h>

namespace Nib
{

namespace
{

thread_local IGLMsgQueue* t_queue = nullptr;

} // namespace

void AttachToThread(IGLMsgQueue* queue)
{
    t_queue = queue;
}

IGLMsgQueue* GetCurrentMsgQueue()
{
    return t_queue;
}

} // namespace Nib
