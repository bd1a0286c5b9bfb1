#ifndef NIB_THREAD_TASK_SCOPE_H
#define NIB_THREAD_TASK_SCOPE_H

#include <nib/task.h>
#include <nib/trace.h>

#include <typeinfo>

namespace Nib
{

/// Wants to know, on one thread, of the tasks that it runs. Nested ones
/// begin and end in order.
class ITaskGroups
{
public:
    virtual void BeginTask(const char* type) = 0;
    virtual void EndTask() = 0;

protected:
    ~ITaskGroups() = default;
};

/// As long as it lives, the calling thread runs a task, or waits for a thread that is to run one.
/// Costs one look at a number while nobody wants to know.
class TaskScope
{
public:
    /// The run of @p task. One of type @p carrier only runs another, and is not told of.
    explicit TaskScope(const ITask& task, const std::type_info* carrier = nullptr)
    {
        if (Trace::s_listeners.load(std::memory_order_relaxed) != 0)
            BeginRun(task, carrier);
    }

    /// A wait until the thread named @p target has run @p task.
    TaskScope(const char* target, const ITask& task)
    {
        if (Trace::IsOn())
            BeginWait(target, task);
    }

    ~TaskScope()
    {
        if (m_isBegun)
            End();
    }

    TaskScope(const TaskScope&) = delete;
    TaskScope& operator=(const TaskScope&) = delete;

    /// Whether any thread may have groups. Relaxed: threads may learn of a change a moment later.
    static void ListenToTasks(bool isListening);

    /// Who wants to know of the tasks that the calling thread begins from now on; null for nobody.
    static void SetGroups(ITaskGroups* groups);

    /// The name of the type of @p task, which lasts for ever.
    static const char* NameOf(const ITask& task);

private:
    void BeginRun(const ITask& task, const std::type_info* carrier);
    void BeginWait(const char* target, const ITask& task);
    void End();

    bool m_isBegun = false;
    bool m_isTraced; // this and the next: once begun
    ITaskGroups* m_groups;
};

} // namespace Nib

#endif
