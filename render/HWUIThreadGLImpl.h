#ifndef NIB_RENDER_HWUI_THREAD_GL_IMPL_H
#define NIB_RENDER_HWUI_THREAD_GL_IMPL_H

#include "base/ThreadAnnotations.h"
#include "render/HWUIObjectObserver.h"
#include "thread/TaskQueue.h"
#include "thread/WatchedCall.h"

#include <nib/base.h>
#include <nib/render_thread.h>
#include <nib/task.h>

#include <atomic>
#include <cstdint>

namespace Nib::GLES
{

/// The HWUI render thread: a queue that the UI's own render thread empties in its draw callback.
///
/// There are two lists of tasks. New tasks go to one; a frame swaps them and runs what the other
/// holds, so that tasks posted by tasks run in the next frame.
//
// Order: m_waitLock, m_queueLock. A frame holds the first while tasks run.
class HWUIThreadGLImpl : public RenderThreadHWUI,
                         public IGLManagedMsgQueue,
                         public RenderThreadHWUI::ISafeLock
{
public:
    HWUIThreadGLImpl(HwuiCallback* callback, const char* tag);
    ~HWUIThreadGLImpl() override;

    // ---- the renderer ----
    IGLMsgQueue* GetMsgQueue() override;
    int GetType() override;
    bool Start() override;
    void OnSurfaceChanged(void* window, int width, int height, int format) override;
    void OnSurfaceDestroyed() override;
    bool Render() override;
    void OnInput(long long event) override;
    void ApplyUpdateRect(const RectF& rect, int rotation) override;
    bool IsAttachedToWindow() override;
    void OnPause() override;
    void OnResume() override;
    RenderThreadHWUI::ISafeLock* GetSafeLock() override;

    // ---- the queue ----
    bool enQueueMsg(ITask* task) override;
    bool waitForCompleting() override;
    bool isRunning() override;
    const char* getTag() override;
    Observer<IManagedObject>* GetObjectObserver() override;
    Observer<IManagedObject>* GetDataObserver() override;

    // ---- the safe lock ----
    void Lock(bool invokeIfNeeded) override;
    void Unlock() override;

    /// Whether the caller is the thread that last called Render().
    bool IsRenderThread();

    /// Limits drawing to the rectangle, whose fields are taken as x, y, width and height of a
    /// scissor box.
    void DoApplyUpdateRect(const RectF& rect);

private:
    void Init();
    void Post(ITask* task);
    int SwapQueues();
    void RunTasks(TaskQueue* queue);
    bool WaitForNextFrame(const char* function);
    void TakeSafeLock() NIB_REQUIRES(m_waitLock);
    void RestoreObjects();

    // ---- the destructor's steps ----
    void RunLastTasks(const char* function);
    int RemoveTasks(TaskQueue& queue);

    HwuiCallback* m_callback; // the application's
    TaskQueue m_queues[2];
    HWUIObjectObserver* m_observer; // one counted reference
    int m_pushQueueIndex = 0;       // changed and used for a push under m_queueLock
    std::atomic<std::uint64_t> m_hwuiThreadId{0};
    std::atomic<bool> m_paused{false};
    const char* m_tag; // the caller's

    CriticalSection m_waitLock; // a frame may be drawn inside it: re-entrant
    CriticalSection m_queueLock NIB_ACQUIRED_AFTER(m_waitLock);
    ConditionalVariable m_lockCondition;
    ConditionalVariable m_waitForCompletingCV;
    bool m_waiting NIB_GUARDED_BY(m_waitLock) = false; // somebody waits for a frame
    // Set and cleared under m_waitLock. Read without it for one question, "is it mine?": only the
    // asking thread itself could change the answer.
    std::atomic<Thread::Handle> m_lockOwner{0};
    int m_lockCount = 0; // the owner's
    bool m_lockRequested NIB_GUARDED_BY(m_waitLock) =
        false; // somebody who can draw waits for the lock
    const WatchTarget m_watched{m_tag, &m_hwuiThreadId, nullptr};
    const WatchTarget m_watchedLock{m_tag, nullptr, nullptr}; // its owner may be any thread
};

} // namespace Nib::GLES

#endif
