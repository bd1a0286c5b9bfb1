#include "Progress.h"

#include <algorithm>
#include <cstdio>
#include <string>
#include <unistd.h>

namespace
{

constexpr int kWidth = 40; // characters
constexpr std::chrono::seconds kPatience{1};
constexpr std::chrono::milliseconds kBetween{100};
constexpr const char* kEraseLine = "\r\033[K";

} // namespace

Progress::Progress(int total)
    : m_total(std::max(total, 1)), m_isTerminal(isatty(STDERR_FILENO) == 1),
      m_next(Clock::now() + kPatience)
{
}

Progress::~Progress()
{
    if (m_isShown)
        std::fputs(kEraseLine, stderr);
}

void Progress::Show(int done)
{
    if (!m_isTerminal)
        return;
    const Clock::time_point now = Clock::now();
    if (now < m_next)
        return;
    m_next = now + kBetween;
    m_isShown = true;
    const double share = std::min(static_cast<double>(done) / m_total, 1.0);
    const int filled = static_cast<int>(share * kWidth);
    const std::string bar = std::string(static_cast<std::size_t>(filled), '#') +
                            std::string(static_cast<std::size_t>(kWidth - filled), '.');
    std::fprintf(stderr, "\r[%s] %3d %%", bar.c_str(), static_cast<int>(share * 100.0));
}
