// The base library for modelled threads: its locks, conditions and threads are the explorer's,
// tasks come from the heap, and nothing is logged or watched.

#include "ModelAtomic.h"

#include "thread/WatchedCall.h"

#include <nib/base.h>

#include <android/log.h>

namespace Nib
{

namespace
{

struct Lock
{
    int owner = -1;
    int depth = 0;
    Model::View view;
};

Lock& LockOf(const CriticalSection* section)
{
    static std::map<const CriticalSection*, Lock> locks;
    static long execution = 0;
    if (std::exchange(execution, Model::Execution()) != Model::Execution())
        locks.clear();
    return locks[section];
}

} // namespace

void CriticalSection::Enter() noexcept
{
    Lock& lock = LockOf(this);
    Model::Before({this, true},
                  [&lock, self = Model::Self()] { return lock.depth == 0 || lock.owner == self; });
    lock.owner = Model::Self();
    ++lock.depth;
    Model::TakeOver(lock.view);
}

void CriticalSection::Leave() noexcept
{
    Lock& lock = LockOf(this);
    Model::Before({this, true});
    Model::HandOn(lock.view);
    if (--lock.depth == 0)
        lock.owner = -1;
}

// ---- conditions ---------------------------------------------------------------------------------

struct ConditionalVariable::Waiter
{
    bool signalled = false;
    Model::View view;
    Waiter* next = nullptr;
};

bool ConditionalVariable::Wait(CriticalSection* section, int) noexcept
{
    Waiter waiter;
    Model::Before({this, true});
    (m_last ? m_last->next : m_first) = &waiter;
    m_last = &waiter;
    section->Leave();
    Model::Before({this, true}, [&waiter] { return waiter.signalled; });
    Model::TakeOver(waiter.view);
    section->Enter();
    return true;
}

void ConditionalVariable::Signal() noexcept
{
    Model::Before({this, true});
    Waiter* const waiter = m_first;
    if (waiter == nullptr)
        return;
    m_first = waiter->next;
    if (m_first == nullptr)
        m_last = nullptr;
    Model::HandOn(waiter->view);
    waiter->signalled = true;
}

// ---- threads ------------------------------------------------------------------------------------

Thread::Thread(Procedure procedure, void* argument, const char* name,
               ThreadPriority priority) noexcept
    : m_procedure(procedure), m_argument(argument), m_name(name), m_priority(priority)
{
}

Thread::~Thread()
{
    join();
}

bool Thread::start() noexcept
{
    m_thread = static_cast<pthread_t>(
        Model::Spawn([procedure = m_procedure, argument = m_argument] { procedure(argument); }));
    m_started = true;
    return true;
}

void Thread::join() noexcept
{
    if (std::exchange(m_started, false))
        Model::Join(static_cast<int>(m_thread));
}

std::uint64_t GetNibCurrentThreadId() noexcept
{
    return static_cast<std::uint64_t>(Model::Self()) + 1;
}

// ---- tasks, on the heap -------------------------------------------------------------------------

ITask::~ITask() = default;

bool ITask::isGlobalLockAllowed()
{
    return true;
}

void* ITask::operator new(std::size_t size)
{
    return ::operator new(size);
}

void ITask::operator delete(void* memory, std::size_t) noexcept
{
    ::operator delete(memory);
}

// ---- the watchdog, which is off -----------------------------------------------------------------

std::atomic<int> WatchedCall::s_limit{0};
void WatchedCall::Enter(Kind, const WatchTarget&, const ITask*, const char*) {}
void WatchedCall::Leave() {}
void WatchedCall::MarkAnswered(const WatchTarget&, const ITask*) {}
void ReadWatchdogEnvironment() {}

} // namespace Nib

extern "C" int __android_log_print(int, const char*, const char*, ...)
{
    return 0;
}
