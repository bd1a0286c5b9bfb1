#include <nib/watchdog.h>

#include "base/Log.h"
#include "thread/CallsInProgress.h"
#include "thread/TypeName.h"

#include <nib/base.h>

#include <algorithm>
#include <climits>
#include <cmath>
#include <condition_variable>
#include <cstdlib>
#include <mutex>

namespace Nib
{

std::atomic<int> WatchedCall::s_limit{0};

namespace
{

void Warn(const std::string& sentence)
{
    NIB_LOG_WARN("Watchdog: %s.", sentence.c_str());
}

/// A thread that sleeps until a call is overdue. It and the calls share one lock, which nobody
/// holds while a line is written: the application may have put its own function behind the log.
class Dog
{
public:
    static Dog& Get()
    {
        static Dog* const dog = new Dog; // for ever: calls may end while the process ends
        return *dog;
    }

    Dog(const Dog&) = delete;
    Dog& operator=(const Dog&) = delete;

    template <typename Access>
    auto With(Access access)
    {
        const std::lock_guard lock(m_mutex);
        return access(m_calls);
    }

    /// After a call was added: the thread is there and looks at it.
    void Watch()
    {
        const std::lock_guard lock(m_mutex);
        if (!m_running && !m_stop)
            m_running = m_thread.start();
        if (m_sleepsUntilCalled)
            m_changed.notify_all();
    }

    void LimitChanged()
    {
        const std::lock_guard lock(m_mutex);
        m_changed.notify_all();
    }

    void Stop()
    {
        {
            const std::lock_guard lock(m_mutex);
            m_stop = true;
            m_changed.notify_all();
        }
        m_thread.join();
    }

private:
    Dog() = default;

    static void Run(void* dog) { static_cast<Dog*>(dog)->RunUntilStopped(); }

    void RunUntilStopped()
    {
        std::unique_lock lock(m_mutex);
        while (!m_stop)
        {
            const std::chrono::milliseconds limit(WatchedCall::Limit());
            if (limit.count() > 0)
                Report(lock, limit);
            Sleep(lock, limit);
        }
    }

    void Report(std::unique_lock<std::mutex>& lock, std::chrono::milliseconds limit)
    {
        const std::vector<std::string> sentences =
            m_calls.TakeOverdue(CallsInProgress::Clock::now(), limit);
        lock.unlock();
        for (const std::string& sentence : sentences)
            Warn(sentence);
        lock.lock();
    }

    /// Ends for no reason too; the loop looks again.
    void Sleep(std::unique_lock<std::mutex>& lock, std::chrono::milliseconds limit)
    {
        if (m_stop || limit.count() != WatchedCall::Limit())
            return;
        const auto next = limit.count() > 0 ? m_calls.NextOverdue(limit) : std::nullopt;
        if (next)
        {
            m_changed.wait_until(lock, *next);
            return;
        }
        m_sleepsUntilCalled = true;
        m_changed.wait(lock);
        m_sleepsUntilCalled = false;
    }

    std::mutex m_mutex;
    std::condition_variable m_changed;
    CallsInProgress m_calls;
    bool m_running = false;
    bool m_stop = false;
    bool m_sleepsUntilCalled = false;
    Thread m_thread{&Run, this, "nib_watchdog", 0};
};

/// Ends the watchdog's thread before the library's code goes away.
struct EndOfLibrary
{
    std::atomic<bool> watched{false};
    ~EndOfLibrary()
    {
        if (watched.load(std::memory_order_acquire))
            Dog::Get().Stop();
    }
};

EndOfLibrary g_end;

int LimitFromEnvironment()
{
    const char* text = std::getenv("NIB_WATCHDOG");
    if (text == nullptr || *text == '\0')
        return 0;
    char* end = nullptr;
    const double seconds = std::strtod(text, &end);
    if (*end != '\0' || !std::isfinite(seconds) || seconds < 0)
    {
        Warn(std::string("NIB_WATCHDOG is '") + text + "', not a number of seconds; it stays off");
        return 0;
    }
    return static_cast<int>(std::min(std::ceil(seconds * 1000), static_cast<double>(INT_MAX)));
}

} // namespace

void ReadWatchdogEnvironment()
{
    static const bool read = []
    {
        WatchedCall::SetLimit(LimitFromEnvironment()); // nobody waits yet
        return true;
    }();
    static_cast<void>(read);
}

void WatchedCall::Enter(Kind kind, const WatchTarget& target, const ITask* task, const char* what)
{
    m_kind = kind;
    m_task = task;
    m_caller = GetNibCurrentThreadId();
    m_type = task ? TypeOf(*task) : nullptr;
    m_what = what;
    m_begin = CallsInProgress::Clock::now();
    m_reported = false;
    m_answered = false;
    m_target = &target;
    g_end.watched.store(true, std::memory_order_release);
    const auto deadlock = Dog::Get().With(
        [this](CallsInProgress& calls) -> std::optional<std::string>
        {
            if (calls.HasOuterWait(*this))
            {
                m_target = nullptr;
                return std::nullopt;
            }
            calls.Add(*this);
            return m_kind == Kind::Wait ? calls.Deadlock(*this) : std::nullopt;
        });
    if (m_target == nullptr)
        return;
    Dog::Get().Watch();
    if (deadlock)
        Warn(*deadlock);
}

void WatchedCall::Leave()
{
    const auto now = CallsInProgress::Clock::now();
    const std::string end = Dog::Get().With(
        [&](CallsInProgress& calls)
        {
            calls.Remove(*this);
            return calls.IsReported(*this) ? calls.End(*this, now) : std::string();
        });
    if (!end.empty())
        NIB_LOG_INFO("Watchdog: %s.", end.c_str());
}

void WatchedCall::MarkAnswered(const WatchTarget& target, const ITask* task)
{
    Dog::Get().With([&](CallsInProgress& calls) { calls.MarkAnswered(target, task); });
}

void Watchdog::SetLimit(int milliseconds)
{
    ReadWatchdogEnvironment();
    WatchedCall::SetLimit(std::max(milliseconds, 0));
    Dog::Get().LimitChanged();
}

int Watchdog::GetLimit()
{
    return WatchedCall::Limit();
}

} // namespace Nib
