#ifndef NIB_TESTS_SOAK_WATCH_H
#define NIB_TESTS_SOAK_WATCH_H

#include "Progress.h"

#include <condition_variable>
#include <mutex>
#include <thread>

namespace Soak
{

/// Ends the process, and says what every family was doing, when nothing new is begun for long.
class Watch
{
public:
    explicit Watch(const Progress& progress);
    ~Watch();
    Watch(const Watch&) = delete;
    Watch& operator=(const Watch&) = delete;

private:
    void Run();
    [[noreturn]] void Report() const;

    const Progress& m_progress;
    std::mutex m_lock;
    std::condition_variable m_end;
    bool m_isOver = false;
    std::thread m_thread;
};

} // namespace Soak

#endif
