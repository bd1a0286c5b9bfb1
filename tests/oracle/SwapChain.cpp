#include "oracle/SwapChain.h"

#include <algorithm>

namespace Oracle
{

SwapChain::SwapChain(int buffers) : m_frames(static_cast<std::size_t>(buffers), 0) {}

int SwapChain::AgeOf(std::size_t buffer) const
{
    return m_frames[buffer] == 0 ? 0 : m_next - m_frames[buffer];
}

bool SwapChain::IsGivenOut(std::size_t buffer) const
{
    return m_frames.size() == 1 || AgeOf(buffer) != 1;
}

std::vector<int> SwapChain::Ages() const
{
    std::vector<int> ages{0};
    for (std::size_t buffer = 0; buffer < m_frames.size(); ++buffer)
    {
        if (IsGivenOut(buffer) && AgeOf(buffer) != 0)
            ages.push_back(AgeOf(buffer));
    }
    std::sort(ages.begin(), ages.end());
    return ages;
}

bool SwapChain::HasFresh() const
{
    return std::find(m_frames.begin(), m_frames.end(), 0) != m_frames.end();
}

int SwapChain::Nearest(int wanted) const
{
    const std::vector<int> ages = Ages();
    const auto found = std::lower_bound(ages.begin(), ages.end(), wanted);
    if (found != ages.end())
        return *found;
    return HasFresh() ? 0 : ages.back();
}

void SwapChain::Present(int age)
{
    // A buffer without content is the one that never had any, else the oldest.
    std::size_t chosen = m_frames.size();
    for (std::size_t buffer = 0; buffer < m_frames.size(); ++buffer)
    {
        if (!IsGivenOut(buffer) || (age != 0 && AgeOf(buffer) != age))
            continue;
        if (chosen == m_frames.size() || m_frames[buffer] < m_frames[chosen])
            chosen = buffer;
    }
    m_frames.at(chosen) = m_next;
    ++m_next;
}

Scenario Repaired(Scenario scenario)
{
    SwapChain chain(scenario.buffers);
    for (Frame& frame : scenario.frames)
    {
        frame.age = chain.Nearest(frame.age);
        chain.Present(frame.age);
    }
    return scenario;
}

} // namespace Oracle
