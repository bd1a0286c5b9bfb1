#ifndef NIB_TOOLS_PROGRESS_H
#define NIB_TOOLS_PROGRESS_H

#include <chrono>

/// A bar on standard error that grows while work is done, from a second after its start on, and is
/// gone at its end. Nothing where standard error is no terminal.
class Progress
{
public:
    /// @p total is what Show will be told at the end.
    explicit Progress(int total);
    ~Progress();
    Progress(const Progress&) = delete;
    Progress& operator=(const Progress&) = delete;

    /// Seldom writes, and may be called for every sample.
    void Show(int done);

private:
    using Clock = std::chrono::steady_clock;

    int m_total;
    bool m_isTerminal;
    bool m_isShown = false;
    Clock::time_point m_next; ///< when to write again
};

#endif
