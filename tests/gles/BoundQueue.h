#ifndef NIB_TESTS_GLES_BOUND_QUEUE_H
#define NIB_TESTS_GLES_BOUND_QUEUE_H

#include <nib/managed_object.h>
#include <nib/msg_queue.h>
#include <nib/task.h>

#include <memory>

/// The queue face of a render thread, without the render thread: the thread that makes it is bound
/// to it until it is destroyed.
class BoundQueue : public Nib::IGLManagedMsgQueue
{
public:
    BoundQueue() { Nib::AttachToThread(this); }
    ~BoundQueue() override
    {
        if (Nib::GetCurrentMsgQueue() == this)
            Nib::AttachToThread(nullptr);
    }

    bool enQueueMsg(Nib::ITask* task) override
    {
        std::unique_ptr<Nib::ITask> owned(task);
        owned->run();
        return true;
    }
    bool waitForCompleting() override { return true; }
    bool isRunning() override { return true; }
    const char* getTag() override { return "BoundQueue"; }
    Nib::Observer<Nib::IManagedObject>* GetObjectObserver() override { return m_given; }
    Nib::Observer<Nib::IManagedObject>* GetDataObserver() override { return nullptr; }

    /// The queue manages no objects from now on.
    void GiveNoObserver() { m_given = nullptr; }

    Nib::Observer<Nib::IManagedObject> observer;

private:
    Nib::Observer<Nib::IManagedObject>* m_given = &observer;
};

/// A queue that manages no objects, like that of a surface render thread.
class BoundPlainQueue : public Nib::IGLMsgQueue
{
public:
    BoundPlainQueue() { Nib::AttachToThread(this); }
    ~BoundPlainQueue() override { Nib::AttachToThread(nullptr); }

    bool enQueueMsg(Nib::ITask*) override { return false; }
    bool waitForCompleting() override { return true; }
    bool isRunning() override { return true; }
    const char* getTag() override { return "BoundPlainQueue"; }
};

#endif
