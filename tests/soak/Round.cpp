#include "Round.h"

#include "Family.h"

#include <exception>
#include <thread>

namespace Soak
{

namespace
{

constexpr int kActions = 16; ///< of one family in a round
constexpr std::uint64_t kSeedsApart = 1000003;

} // namespace

Round::Round(World& world, Progress& progress, std::uint64_t seed)
    : m_world(world), m_progress(progress), m_seed(seed)
{
}

std::string Round::Run(int families)
{
    std::vector<std::thread> threads;
    for (int family = 0; family < families; ++family)
        threads.emplace_back([this, family] { Live(family); });
    for (std::thread& thread : threads)
        thread.join();
    return m_failure;
}

void Round::Live(int family)
{
    Random random(m_seed * kSeedsApart + static_cast<std::uint64_t>(family));
    const char* doing = "its start";
    try
    {
        m_progress.Begin(family, doing);
        Family living(m_world);
        for (int i = 0; i < kActions; ++i)
        {
            const Action& action = *m_actions[static_cast<std::size_t>(
                random.Below(static_cast<int>(m_actions.size())))];
            doing = action.Name();
            m_progress.Begin(family, doing);
            action.Run(living, random);
            m_world.actions.fetch_add(1, std::memory_order_relaxed);
        }
        doing = "its end";
        m_progress.Begin(family, doing);
    }
    catch (const std::exception& failure)
    {
        Keep("thread " + std::to_string(family) + ", " + doing + ": " + failure.what());
    }
    m_digest.fetch_add(random.Digest(), std::memory_order_relaxed);
    m_progress.Begin(family, nullptr);
}

void Round::Keep(const std::string& failure)
{
    const std::lock_guard<std::mutex> lock(m_lock);
    if (m_failure.empty())
        m_failure = failure;
}

} // namespace Soak
