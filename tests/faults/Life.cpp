#include "faults/Life.h"

#include <atomic>
#include <exception>
#include <memory>

using namespace Nib;

namespace
{

class CallTask : public ITask
{
public:
    explicit CallTask(std::function<void()> call) : m_call(std::move(call)) {}
    void run() override { m_call(); }

private:
    std::function<void()> m_call;
};

} // namespace

std::vector<std::string> Life::Notes() const
{
    const std::lock_guard<std::mutex> lock(m_lock);
    return m_notes;
}

void Life::Note(const std::string& text)
{
    const std::lock_guard<std::mutex> lock(m_lock);
    m_notes.push_back(text);
}

void Life::OnThread(RenderThreadGL& thread, std::function<void()> work)
{
    PostAndWait(thread,
                [this, work = std::move(work)]
                {
                    if (RendererFactory::GetContextHolder()->GetCurrentContextId())
                        work();
                    else
                        Note("no context");
                });
}

void Life::EndOnThread(RenderThreadGL& thread, DrawnThings& things)
{
    PostAndWait(thread, [&things] { things.Release(); }); // also where there is no context
}

void Life::ExportOnThread(RenderThreadGL& thread, DrawnThings& things, float shade)
{
    OnThread(thread,
             [&things, shade]
             {
                 things.DrawOffscreen(shade);
                 things.Export();
             });
}

void Life::PostAndWait(RenderThreadGL& thread, std::function<void()> work)
{
    const auto hasRun = std::make_shared<std::atomic<bool>>(false);
    const auto guarded = [this, hasRun, work = std::move(work)]
    {
        hasRun->store(true, std::memory_order_release);
        try
        {
            work();
        }
        catch (const std::exception& failure)
        {
            Note(failure.what());
        }
    };
    IGLMsgQueue* const queue = thread.GetMsgQueue();
    if (!queue->enQueueMsg(new CallTask(guarded)))
        Note("not queued");
    if (!queue->waitForCompleting())
        Note("not waited for");
    if (!hasRun->load(std::memory_order_acquire))
        Note("not run yet"); // a guest's wait ends with a frame, also with one that runs nothing
    Settle();
}
