#include "KillPoint.h"

#include <csignal>
#include <cstddef>
#include <cstdio>

#include <fcntl.h>
#include <sys/syscall.h>
#include <unistd.h>

namespace
{

int s_stepsLeft = -1; // below 0: lives on

bool IsLast()
{
    return s_stepsLeft >= 0 && s_stepsLeft-- == 0;
}

[[noreturn]] void Die()
{
    kill(getpid(), SIGKILL);
    for (;;)
        pause();
}

} // namespace

namespace CacheKill
{

void DieAfter(int steps)
{
    s_stepsLeft = steps;
}

} // namespace CacheKill

// In front of the system's: the library's files go through these.
extern "C"
{
    __attribute__((visibility("default"))) ssize_t write(int file, const void* data, size_t size)
    {
        if (!IsLast())
            return syscall(SYS_write, file, data, size);
        syscall(SYS_write, file, data, size / 2);
        Die();
    }

    __attribute__((visibility("default"))) int rename(const char* from, const char* to) noexcept
    {
        if (!IsLast())
            return static_cast<int>(syscall(SYS_renameat2, AT_FDCWD, from, AT_FDCWD, to, 0));
        Die();
    }

    __attribute__((visibility("default"))) int unlink(const char* path) noexcept
    {
        const bool isLast = IsLast();
        const int result = static_cast<int>(syscall(SYS_unlinkat, AT_FDCWD, path, 0));
        if (isLast)
            Die();
        return result;
    }
}
