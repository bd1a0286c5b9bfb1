#include "render/RenderTestSupport.h"

#include <gtest/gtest.h>

#include <sys/resource.h>

#include <cstdio>

using namespace Nib;

// ---- tasks --------------------------------------------------------------------------------------

namespace
{

class CallTask : public ITask
{
public:
    explicit CallTask(std::function<void()> function) : m_function(std::move(function)) {}
    void run() override { m_function(); }

private:
    std::function<void()> m_function;
};

} // namespace

ITask* NewCall(std::function<void()> function)
{
    return new CallTask(std::move(function));
}

void Post(IGLMsgQueue* queue, std::function<void()> function)
{
    ASSERT_TRUE(queue->enQueueMsg(NewCall(std::move(function))));
}

void RunOn(IGLMsgQueue* queue, const std::function<void()>& function)
{
    Event done;
    Post(queue,
         [&]
         {
             function();
             done.Set();
         });
    done.Wait();
}

void Event::Set()
{
    // Signalled under the lock: whoever waits may destroy the event as soon as the lock is free.
    const std::lock_guard lock(m_mutex);
    m_set = true;
    m_condition.notify_all();
}

bool Event::WaitFor(std::chrono::milliseconds time)
{
    std::unique_lock lock(m_mutex);
    return m_condition.wait_for(lock, time, [this] { return m_set; });
}

void Event::Wait()
{
    std::unique_lock lock(m_mutex);
    m_condition.wait(lock, [this] { return m_set; });
}

bool Event::IsSet() const
{
    const std::lock_guard lock(m_mutex);
    return m_set;
}

Gate::Gate(IGLMsgQueue* queue) : Gate(queue, [] {}) {}

Gate::Gate(IGLMsgQueue* queue, std::function<void()> last)
{
    Post(queue,
         [shared = m_shared, last = std::move(last)]
         {
             shared->entered.Set();
             shared->open.Wait();
             last();
         });
    m_shared->entered.Wait();
}

// ---- queues -------------------------------------------------------------------------------------

KeepingQueue::~KeepingQueue()
{
    for (ITask* task : m_tasks)
        delete task;
}

bool KeepingQueue::enQueueMsg(ITask* task)
{
    const std::lock_guard lock(m_mutex);
    if (m_refuses)
        return false;
    m_tasks.push_back(task);
    return true;
}

bool KeepingQueue::waitForCompleting()
{
    ++m_waits;
    if (!m_runsOnWait)
        return false;
    RunAll();
    return true;
}

void KeepingQueue::RunAll()
{
    std::deque<ITask*> tasks;
    {
        const std::lock_guard lock(m_mutex);
        tasks.swap(m_tasks);
    }
    for (ITask* task : tasks)
    {
        task->run();
        delete task;
    }
}

std::size_t KeepingQueue::Count()
{
    const std::lock_guard lock(m_mutex);
    return m_tasks.size();
}

// ---- managed objects ----------------------------------------------------------------------------

void NotedObject::Note(const char* what)
{
    const bool current = eglGetCurrentContext() != EGL_NO_CONTEXT;
    __android_log_print(ANDROID_LOG_DEBUG, "test", "%s %s", m_name.c_str(), what);
    m_notes->push_back(m_name + " " + what + (current ? " with context" : " without context"));
}

// ---- the log ------------------------------------------------------------------------------------

std::vector<std::string> LinesWith(const SimDriver& driver, const std::string& part)
{
    std::vector<std::string> found;
    for (const SimLogLine& line : driver.Log())
    {
        if (line.text.find(part) == std::string::npos)
            continue;
        found.push_back(std::string(1, "??VDIWEF"[line.priority]) + " " + line.text);
    }
    return found;
}

std::string Hex(const void* pointer)
{
    char text[32];
    std::snprintf(text, sizeof(text), "%p", pointer);
    return text;
}

std::vector<std::string> Lines(std::initializer_list<std::string> lines)
{
    return lines;
}

// ---- the system ---------------------------------------------------------------------------------

namespace
{

thread_local int t_requestedNiceValue = -1000;

} // namespace

// In place of the system's, which refuses values below 0 to ordinary users.
extern "C" __attribute__((visibility("default"))) int setpriority(__priority_which_t, id_t,
                                                                  int value) noexcept
{
    t_requestedNiceValue = value;
    return 0;
}

int RequestedNiceValue()
{
    return t_requestedNiceValue;
}

NoMoreThreads::NoMoreThreads()
{
    pthread_getattr_default_np(&m_usual);
    pthread_attr_t huge;
    pthread_attr_init(&huge);
    pthread_attr_setstacksize(&huge, std::size_t{1} << 50); // more than there are addresses
    pthread_setattr_default_np(&huge);
    pthread_attr_destroy(&huge);
}

NoMoreThreads::~NoMoreThreads()
{
    pthread_setattr_default_np(&m_usual);
    pthread_attr_destroy(&m_usual);
}

// Weak: there only when the sanitizer is.
extern "C" __attribute__((weak)) void __lsan_disable();
extern "C" __attribute__((weak)) void __lsan_enable();

LeaksAllowed::LeaksAllowed()
{
    if (__lsan_disable != nullptr)
        __lsan_disable();
}

LeaksAllowed::~LeaksAllowed()
{
    if (__lsan_enable != nullptr)
        __lsan_enable();
}
