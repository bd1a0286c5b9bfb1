#include "faults/FileFaults.h"

#include <cerrno>
#include <cstdarg>
#include <cstdio>
#include <filesystem>
#include <mutex>
#include <set>

#include <fcntl.h>
#include <sys/stat.h>
#include <sys/syscall.h>
#include <unistd.h>

// The C library's functions, replaced for the whole program by ones that make the system call
// themselves.

namespace
{

struct Watch
{
    std::recursive_mutex mutex;
    bool on = false;
    std::string folder;
    FileFault fault;
    std::vector<std::string> calls;
    std::set<int> descriptors;
    int failing = -1; // descriptor whose next call fails
};

Watch& TheWatch()
{
    static Watch* const watch = new Watch;
    return *watch;
}

/// One call: whether it is to go wrong, and how.
class Call
{
public:
    Call(const char* name, const char* path) : Call()
    {
        if (m_watch.on && path && std::string(path).rfind(m_watch.folder, 0) == 0)
            Count(name);
    }
    Call(const char* name, int descriptor) : Call()
    {
        if (!m_watch.on || !m_watch.descriptors.count(descriptor))
            return;
        if (m_watch.failing == descriptor)
        {
            m_kind = FileFault::Error;
            m_watch.failing = -1;
        }
        Count(name);
    }

    /// What to return in place of a call that fails.
    bool Fails() const
    {
        if (m_kind == FileFault::Error)
            errno = m_watch.fault.error;
        return m_kind == FileFault::Error;
    }
    bool FindsTheEnd() const { return m_kind == FileFault::NoMore; }
    std::size_t Length(int descriptor, std::size_t wanted)
    {
        if (m_kind != FileFault::Short && m_kind != FileFault::ShortOnce)
            return wanted;
        if (m_kind == FileFault::ShortOnce)
            m_watch.failing = descriptor;
        return (wanted + 1) / 2;
    }
    void Opened(int descriptor)
    {
        if (m_counted && descriptor >= 0)
            m_watch.descriptors.insert(descriptor);
    }
    void Closed(int descriptor) { m_watch.descriptors.erase(descriptor); }

private:
    Call() : m_watch(TheWatch()), m_lock(m_watch.mutex) {}

    void Count(const char* name)
    {
        m_counted = true;
        m_watch.calls.emplace_back(name);
        if (m_watch.calls.size() != m_watch.fault.call)
            return;
        m_kind = m_watch.fault.kind;
        if (m_kind != FileFault::Vanish)
            return;
        m_watch.on = false; // the removal is not the library's
        std::error_code ignored;
        std::filesystem::remove_all(m_watch.folder, ignored);
        m_watch.on = true;
    }

    Watch& m_watch;
    std::lock_guard<std::recursive_mutex> m_lock;
    FileFault::Kind m_kind = FileFault::None;
    bool m_counted = false;
};

} // namespace

void WatchFiles(const std::string& folder, const FileFault& fault)
{
    Watch& watch = TheWatch();
    const std::lock_guard lock(watch.mutex);
    watch.folder = folder;
    watch.fault = fault;
    watch.on = true;
}

std::vector<std::string> FileCalls()
{
    Watch& watch = TheWatch();
    const std::lock_guard lock(watch.mutex);
    return watch.calls;
}

#define NIB_REPLACES extern "C" __attribute__((visibility("default")))

NIB_REPLACES int open(const char* path, int flags, ...)
{
    va_list arguments;
    va_start(arguments, flags);
    const mode_t mode = (flags & (O_CREAT | O_TMPFILE)) != 0 ? va_arg(arguments, mode_t) : 0;
    va_end(arguments);
    Call call("open", path);
    if (call.Fails())
        return -1;
    const int descriptor = static_cast<int>(syscall(SYS_openat, AT_FDCWD, path, flags, mode));
    call.Opened(descriptor);
    return descriptor;
}

// Of the watched folder, which was opened before: its path is then not asked for.
NIB_REPLACES int openat(int folder, const char* path, int flags, ...)
{
    va_list arguments;
    va_start(arguments, flags);
    const mode_t mode = (flags & (O_CREAT | O_TMPFILE)) != 0 ? va_arg(arguments, mode_t) : 0;
    va_end(arguments);
    Call call("open", folder);
    if (call.Fails())
        return -1;
    const int descriptor = static_cast<int>(syscall(SYS_openat, folder, path, flags, mode));
    call.Opened(descriptor);
    return descriptor;
}

NIB_REPLACES ssize_t read(int descriptor, void* buffer, std::size_t length)
{
    {
        Call call("read", descriptor);
        if (call.Fails())
            return -1;
        if (call.FindsTheEnd())
            return 0;
        length = call.Length(descriptor, length);
    }
    return syscall(SYS_read, descriptor, buffer, length); // without the lock: it may block
}

NIB_REPLACES ssize_t write(int descriptor, const void* buffer, std::size_t length)
{
    {
        Call call("write", descriptor);
        if (call.Fails())
            return -1;
        length = call.Length(descriptor, length);
    }
    return syscall(SYS_write, descriptor, buffer, length);
}

NIB_REPLACES int close(int descriptor)
{
    Call call("close", descriptor);
    const int result = static_cast<int>(syscall(SYS_close, descriptor));
    call.Closed(descriptor);
    return call.Fails() ? -1 : result;
}

NIB_REPLACES int access(const char* path, int mode) noexcept
{
    const Call call("access", path);
    return call.Fails() ? -1 : static_cast<int>(syscall(SYS_faccessat, AT_FDCWD, path, mode));
}

NIB_REPLACES int mkdir(const char* path, mode_t mode) noexcept
{
    const Call call("mkdir", path);
    return call.Fails() ? -1 : static_cast<int>(syscall(SYS_mkdirat, AT_FDCWD, path, mode));
}

NIB_REPLACES int rename(const char* from, const char* to) noexcept
{
    const Call call("rename", to);
    return call.Fails() ? -1
                        : static_cast<int>(syscall(SYS_renameat2, AT_FDCWD, from, AT_FDCWD, to, 0));
}

NIB_REPLACES int unlink(const char* path) noexcept
{
    const Call call("unlink", path);
    return call.Fails() ? -1 : static_cast<int>(syscall(SYS_unlinkat, AT_FDCWD, path, 0));
}
