#ifndef NIB_TESTS_SOAK_BATCH_H
#define NIB_TESTS_SOAK_BATCH_H

#include "PostTask.h"

#include <nib/nib.h>

#include <exception>
#include <future>
#include <memory>
#include <utility>
#include <vector>

namespace Soak
{

/// Work under way on render threads. What one throws comes back to the thread that waits.
class Batch
{
public:
    Batch() = default;
    Batch(const Batch&) = delete;
    Batch& operator=(const Batch&) = delete;
    ~Batch() { WaitForAll(); } // the work may refer to its owner

    /// Runs @p work on @p thread, later.
    template <typename Work>
    void Post(Nib::RenderThreadGL& thread, Work work)
    {
        auto task = std::make_shared<std::packaged_task<void()>>(std::move(work));
        m_results.push_back(task->get_future());
        Ink::Post(*thread.GetMsgQueue(), [task] { (*task)(); });
    }

    /// [blocks] Throws the first thing that was thrown.
    void Finish()
    {
        WaitForAll();
        for (std::future<void>& result : std::exchange(m_results, {}))
            result.get();
    }

private:
    void WaitForAll() const
    {
        for (const std::future<void>& result : m_results)
            result.wait();
    }

    std::vector<std::future<void>> m_results;
};

} // namespace Soak

#endif
