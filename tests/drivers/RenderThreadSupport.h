#ifndef NIB_TESTS_DRIVERS_RENDER_THREAD_SUPPORT_H
#define NIB_TESTS_DRIVERS_RENDER_THREAD_SUPPORT_H

#include <nib/msg_queue.h>
#include <nib/task.h>

#include <array>
#include <functional>
#include <future>
#include <utility>

/// A task that calls a function.
class CallTask : public Nib::ITask
{
public:
    explicit CallTask(std::function<void()> function) : m_function(std::move(function)) {}
    void run() override { m_function(); }

private:
    std::function<void()> m_function;
};

/// Calls @p function on a render thread, and waits until it has returned.
inline void RunOn(Nib::IGLMsgQueue* queue, const std::function<void()>& function)
{
    std::promise<void> done;
    queue->enQueueMsg(new CallTask(
        [&]
        {
            function();
            done.set_value();
        }));
    done.get_future().wait();
}

using Rgba = std::array<unsigned char, 4>;

#endif
