#ifndef INK_POST_TASK_H
#define INK_POST_TASK_H

#include <nib/msg_queue.h>
#include <nib/task.h>

#include <memory>
#include <utility>

namespace Ink
{

/// Runs a callable on a render thread. It must not throw: a task has nobody to catch it.
template <typename Callable>
class CallableTask : public Nib::ITask
{
public:
    explicit CallableTask(Callable callable) : m_callable(std::move(callable)) {}
    void run() override { m_callable(); }

private:
    Callable m_callable;
};

/// Posts @p callable to @p queue; it runs later, on the queue's thread, after everything posted
/// before. Never blocks.
template <typename Callable>
void Post(Nib::IGLMsgQueue& queue, Callable callable)
{
    auto task = std::make_unique<CallableTask<Callable>>(std::move(callable));
    if (queue.enQueueMsg(task.get()))
        static_cast<void>(task.release()); // the queue owns it now
}

/// The way the factory's objects are ended.
struct Releaser
{
    template <typename T>
    void operator()(T* object) const
    {
        object->Release();
    }
};

/// Owns an object of the factory; to be reset on the thread that made it.
template <typename T>
using Owned = std::unique_ptr<T, Releaser>;

} // namespace Ink

#endif
