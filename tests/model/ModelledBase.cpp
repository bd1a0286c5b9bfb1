// The base library for modelled threads: its locks, conditions and threads are the explorer's,
// tasks come from the heap, and nothing is logged or watched.

#include "ModelAtomic.h"

#include "base/Futex.h"
#include "thread/SpinPartners.h"
#include "thread/TaskScope.h"
#include "thread/WatchedCall.h"

#include <nib/base.h>
#include <nib/trace.h>

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

// ---- sleeping on a word -------------------------------------------------------------------------

namespace
{

/// Those that sleep, each with the word that it sleeps on.
std::list<std::atomic<int>*>& Sleepers()
{
    static std::list<std::atomic<int>*> sleepers;
    static long execution = 0;
    if (std::exchange(execution, Model::Execution()) != Model::Execution())
        sleepers.clear();
    return sleepers;
}

} // namespace

// As the system does it: a sleeper can be woken from before it compares the newest value. It orders
// nothing else.
bool FutexWait(std::atomic<int>& word, int value, const timespec*)
{
    std::list<std::atomic<int>*>& sleepers = Sleepers();
    Model::Before({&sleepers, true});
    const auto self = sleepers.insert(sleepers.end(), &word);
    const bool sleeps = word.fetch_add(0, std::memory_order_relaxed) == value;
    Model::Before({&sleepers, true}, [=] { return !sleeps || *self == nullptr; });
    sleepers.erase(self);
    return true;
}

void FutexWake(std::atomic<int>& word)
{
    Model::Before({&Sleepers(), true});
    for (std::atomic<int>*& sleeper : Sleepers())
    {
        if (sleeper == &word)
        {
            sleeper = nullptr;
            return;
        }
    }
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

Thread::Handle Thread::self() noexcept
{
    return Model::Self() + 1;
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

// ---- spinning, which nobody does ----------------------------------------------------------------

bool SpinPartners::WorkerMaySpin() const
{
    return false;
}
bool SpinPartners::CallerMaySpin(const std::atomic<std::uint64_t>&)
{
    return false;
}
void SpinPartners::WorkerSpunInVain() {}
void SpinPartners::CallerSpunInVain() {}

// ---- the trace, which is off --------------------------------------------------------------------

std::atomic<unsigned> Trace::s_listeners{0};
void Trace::Write(TraceEvent::Kind, const char*, const char*, std::initializer_list<TraceArgument>)
{
}
void Trace::WriteCounter(const char*, const char*, std::int64_t, std::uint64_t, const char*) {}
const char* Trace::ExchangeLane(const char*)
{
    return nullptr;
}
void Trace::StartFromEnvironment() {}
void TaskScope::BeginRun(const ITask&, const std::type_info*) {}
void TaskScope::BeginWait(const char*, const ITask&) {}
void TaskScope::End() {}

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
