#include "base/linux/LogThreshold.h"

#include "base/linux/LogWriter.h"
#include "base/LogSinkHolder.h"

#include <algorithm>
#include <climits>
#include <mutex>

namespace Nib
{

namespace
{

constexpr int kUnknown = INT_MIN;

}

std::atomic<int> g_lowestWanted{kUnknown};

bool IsDroppedByNow(int priority)
{
    if (g_lowestWanted.load(std::memory_order_relaxed) == kUnknown)
        FindLowestWanted();
    return IsDropped(priority);
}

void FindLowestWanted()
{
    // So that of two changes the later one is what stays.
    static std::mutex& mutex = *new std::mutex; // threads may log until the process has ended
    const std::lock_guard<std::mutex> lock(mutex);
    const int lowest = std::min(LowestLogged(), LogSinkHolder::Instance().LowestWanted());
    g_lowestWanted.store(lowest, std::memory_order_relaxed);
}

} // namespace Nib
