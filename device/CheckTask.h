#ifndef NIB_DEVICE_CHECKTASK_H
#define NIB_DEVICE_CHECKTASK_H

namespace Nib
{

class IGLMsgQueue;

/// Runs @p check, which writes its answer through its argument, on the thread of @p queue, and
/// waits for it. When the queue does not take the task, @p result stays as it is.
void RunCheck(IGLMsgQueue& queue, void (*check)(bool*), bool* result);

} // namespace Nib

#endif
