#ifndef NIB_TESTS_RENDER_RENDER_TEST_SUPPORT_H
#define NIB_TESTS_RENDER_RENDER_TEST_SUPPORT_H

#include "sim/SimDriver.h"

#include <nib/managed_object.h>
#include <nib/msg_queue.h>
#include <nib/render_thread.h>
#include <nib/task.h>

#include <atomic>
#include <chrono>
#include <condition_variable>
#include <deque>
#include <functional>
#include <memory>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

#include <pthread.h>

// ---- tasks --------------------------------------------------------------------------------------

/// A task that calls @p function.
Nib::ITask* NewCall(std::function<void()> function);

/// Posts a call to @p queue.
void Post(Nib::IGLMsgQueue* queue, std::function<void()> function);

/// Posts a call to @p queue and waits until it has returned.
void RunOn(Nib::IGLMsgQueue* queue, const std::function<void()>& function);

/// Posts a call and gives what it returns.
template <typename Function>
auto AskOn(Nib::IGLMsgQueue* queue, Function function)
{
    decltype(function()) answer{};
    RunOn(queue, [&] { answer = function(); });
    return answer;
}

/// Something that happens once, on any thread.
class Event
{
public:
    void Set();
    void Wait();
    /// False when it was not set in time.
    bool WaitFor(std::chrono::milliseconds time);
    bool IsSet() const;

private:
    mutable std::mutex m_mutex;
    std::condition_variable m_condition;
    bool m_set = false;
};

/// Holds a render thread in a task, from construction until Open().
class Gate
{
public:
    explicit Gate(Nib::IGLMsgQueue* queue);
    /// The task also calls @p last, before it ends.
    Gate(Nib::IGLMsgQueue* queue, std::function<void()> last);
    ~Gate() { Open(); }
    void Open() { m_shared->open.Set(); }

private:
    struct Shared
    {
        Event entered;
        Event open;
    };

    std::shared_ptr<Shared> m_shared = std::make_shared<Shared>();
};

// ---- queues -------------------------------------------------------------------------------------

/// A parent that keeps its tasks until told to run them, or refuses them.
class KeepingQueue : public Nib::IGLMsgQueue
{
public:
    ~KeepingQueue() override;

    bool enQueueMsg(Nib::ITask* task) override;
    bool waitForCompleting() override;
    bool isRunning() override { return true; }
    const char* getTag() override { return "keeper"; }

    void Refuse() { m_refuses = true; }
    void RunWhileWaitedFor() { m_runsOnWait = true; }
    void RunAll();
    std::size_t Count();
    int Waits() const { return m_waits; }

private:
    std::mutex m_mutex;
    std::deque<Nib::ITask*> m_tasks;
    std::atomic<bool> m_refuses{false};
    std::atomic<bool> m_runsOnWait{false};
    std::atomic<int> m_waits{0};
};

// ---- managed objects ----------------------------------------------------------------------------

/// Writes what it is told, and whether there is a context then, to a list and, without the latter,
/// to the log.
class NotedObject : public Nib::IManagedObject
{
public:
    NotedObject(std::string name, std::vector<std::string>* notes)
        : m_name(std::move(name)), m_notes(notes)
    {
    }

    void OnRelease() override { Note("release"); }
    void OnRestore() override { Note("restore"); }
    void ReleaseGLObject() override {}
    void RestoreGLObject() override {}

private:
    void Note(const char* what);

    std::string m_name;
    std::vector<std::string>* m_notes;
};

// ---- the log ------------------------------------------------------------------------------------

/// The lines that contain @p part, in order, each behind the letter of its priority: "I text".
std::vector<std::string> LinesWith(const SimDriver& driver, const std::string& part);

/// A pointer as the log shows it.
std::string Hex(const void* pointer);

std::vector<std::string> Lines(std::initializer_list<std::string> lines);

// ---- the system ---------------------------------------------------------------------------------

/// The nice value that the calling thread has asked the system for; -1000 for none.
int RequestedNiceValue();

/// As long as it lives, no thread can be started.
class NoMoreThreads
{
public:
    NoMoreThreads();
    ~NoMoreThreads();

private:
    pthread_attr_t m_usual;
};

/// What is allocated while it lives may stay for ever: a task that is queued on a worker which
/// never runs is neither run nor deleted.
class LeaksAllowed
{
public:
    LeaksAllowed();
    ~LeaksAllowed();
};

#endif
