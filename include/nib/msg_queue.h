#ifndef NIB_MSG_QUEUE_H
#define NIB_MSG_QUEUE_H

/// @file
/// The queue face of a render thread, and the slot that binds a thread to it.

#include <nib/export.h>

namespace Nib
{

class ITask;
class IManagedObject;
template <typename T>
class Observer;

/// A render thread as those see it who have GL work for it: resources, the shader manager, drawing
/// code.
///
/// Owner    nobody on its own: it is a second face of a render thread
/// (RenderThreadGL::GetMsgQueue).
///          Deleting it deletes the whole render thread.
/// Threads  every operation may be called from any thread, but for waitForCompleting on the render
///          thread itself. [blocks] waits without time-out; [posts] returns at once.
/// Failure  false, and a log line. Nothing throws.
class NIB_EXPORT IGLMsgQueue
{
public:
    virtual ~IGLMsgQueue();

    /// [posts] @p task runs later on the render thread, after all that were posted before it; the
    /// queue then deletes it. False: the queue did not take it, and the caller still owns it.
    virtual bool enQueueMsg(ITask* task) = 0;

    /// [blocks] until every task that was posted before the call has run. False, without waiting,
    /// when the render thread is paused or not started. Called on the render thread itself it never
    /// returns, except on the HWUI render thread, which runs the tasks at once.
    virtual bool waitForCompleting() = 0;

    /// Whether tasks are being run: false for a render thread that is paused or not started. The
    /// surface and the HWUI render thread always answer true.
    virtual bool isRunning() = 0;

    /// The name that the render thread was made with: the caller's pointer, not a copy.
    virtual const char* getTag() = 0;

    /// Whether the render thread now presents without waiting for the display. No render thread
    /// supports it: the argument is ignored and the answer is false.
    virtual bool setTearingAllowed(bool allowed);

protected:
    IGLMsgQueue() = default;
    IGLMsgQueue(const IGLMsgQueue&) = delete;
    IGLMsgQueue& operator=(const IGLMsgQueue&) = delete;
};

/// The queue face of a render thread whose GL objects outlive its context: they subscribe here to
/// learn of the loss of the context and of the next one (managed_object.h).
class NIB_EXPORT IGLManagedMsgQueue : public IGLMsgQueue
{
public:
    ~IGLManagedMsgQueue() override;

    /// The list of objects that own GL names; owned by the render thread. Null when this render
    /// thread manages no objects.
    virtual Observer<IManagedObject>* GetObjectObserver() = 0;

    /// The list of objects whose data is to be restored; owned by the render thread. The
    /// front-buffer and the offscreen render thread answer as GetObjectObserver does, the HWUI one
    /// with null.
    virtual Observer<IManagedObject>* GetDataObserver() = 0;
};

/// Binds the calling thread to @p queue, which is borrowed; null unbinds it. Render threads do this
/// themselves once their context is current.
NIB_EXPORT void AttachToThread(IGLMsgQueue* queue);

/// The queue that the calling thread is bound to, or null. Not a check of life: a thread that
/// outlives its queue still answers with the old pointer until it is bound anew.
NIB_EXPORT IGLMsgQueue* GetCurrentMsgQueue();

} // namespace Nib

#endif
