#ifndef NIB_TESTS_SOAK_PROGRESS_H
#define NIB_TESTS_SOAK_PROGRESS_H

#include <array>
#include <atomic>

namespace Soak
{

/// What each family is doing, for whoever finds that nothing goes on.
class Progress
{
public:
    static constexpr int kMostFamilies = 16;

    /// @p action is a literal; null when the family is at its end.
    void Begin(int family, const char* action)
    {
        m_doing[static_cast<std::size_t>(family)].store(action, std::memory_order_relaxed);
        m_steps.fetch_add(1, std::memory_order_relaxed);
    }

    const char* Doing(int family) const
    {
        return m_doing[static_cast<std::size_t>(family)].load(std::memory_order_relaxed);
    }

    /// Grows with everything that is begun.
    long Steps() const { return m_steps.load(std::memory_order_relaxed); }

private:
    std::array<std::atomic<const char*>, kMostFamilies> m_doing{};
    std::atomic<long> m_steps{0};
};

} // namespace Soak

#endif
