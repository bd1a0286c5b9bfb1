#include "Watch.h"

#include <chrono>
#include <cstdio>
#include <cstdlib>

namespace Soak
{

namespace
{

constexpr std::chrono::minutes kPatience{5}; // a sanitizer on a slow driver takes half of one

} // namespace

Watch::Watch(const Progress& progress) : m_progress(progress), m_thread([this] { Run(); }) {}

Watch::~Watch()
{
    {
        const std::lock_guard<std::mutex> lock(m_lock);
        m_isOver = true;
    }
    m_end.notify_one();
    m_thread.join();
}

void Watch::Run()
{
    std::unique_lock<std::mutex> lock(m_lock);
    long seen = -1;
    while (seen != m_progress.Steps())
    {
        seen = m_progress.Steps();
        if (m_end.wait_for(lock, kPatience, [this] { return m_isOver; }))
            return;
    }
    Report();
}

void Watch::Report() const
{
    std::fprintf(stderr, "soak: nothing was begun for 5 minutes\n");
    for (int family = 0; family < Progress::kMostFamilies; ++family)
    {
        if (const char* const action = m_progress.Doing(family))
            std::fprintf(stderr, "soak: thread %d is stuck in: %s\n", family, action);
    }
    std::abort();
}

} // namespace Soak
