#include "thread/SpinPartners.h"

#include <cstdlib>
#include <cstring>

#include <sched.h>

namespace Nib
{

bool SpinPartners::IsOn()
{
    static const bool on = []
    {
        const char* const value = std::getenv("NIB_SPIN");
        return value == nullptr || std::strcmp(value, "0") != 0;
    }();
    return on;
}

bool SpinPartners::CanRunTogether(std::uint64_t one, std::uint64_t other)
{
    cpu_set_t all;
    CPU_ZERO(&all);
    for (const std::uint64_t thread : {one, other})
    {
        cpu_set_t processors;
        CPU_ZERO(&processors);
        // Refused for a thread that has ended, and where there are more processors than fit.
        if (sched_getaffinity(static_cast<pid_t>(thread), sizeof processors, &processors) == 0)
            CPU_OR(&all, &all, &processors);
    }
    return CPU_COUNT(&all) > 1;
}

bool SpinPartners::WorkerMaySpin() const
{
    return m_maySpin.load(std::memory_order_relaxed);
}

void SpinPartners::WorkerSpunInVain()
{
    const std::uint64_t caller = m_callerNumber.load(std::memory_order_relaxed);
    m_maySpin.store(CanRunTogether(0, caller), std::memory_order_relaxed);
}

bool SpinPartners::CallerMaySpin(const std::atomic<std::uint64_t>& worker)
{
    if (!IsOn())
        return false;
    const Thread::Handle caller = Thread::self();
    if (caller == m_caller && --m_callsUntilLook > 0)
        return m_maySpin.load(std::memory_order_relaxed);

    m_caller = caller;
    m_callerNumber.store(GetNibCurrentThreadId(), std::memory_order_relaxed);
    const bool maySpin = CanRunTogether(0, worker.load(std::memory_order_relaxed));
    m_callsUntilLook = maySpin ? kCallsBetweenLooks : kSleepsBetweenLooks;
    m_maySpin.store(maySpin, std::memory_order_relaxed);
    return maySpin;
}

void SpinPartners::CallerSpunInVain()
{
    m_callsUntilLook = 0;
}

} // namespace Nib
