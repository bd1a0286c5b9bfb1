#include "base/Folders.h"

#include <nib/base.h>

#include <cerrno>
#include <cstdint>
#include <cstring>

#include <fcntl.h>
#include <unistd.h>

namespace Nib
{

namespace
{

// Before the process's mask.
constexpr mode_t kFileMode = 0666;
constexpr mode_t kPrivateFileMode = 0600;

// The flags that fopen() would use for the mode, with "n" and "p" besides; -1 for an unknown one.
int OpenFlags(const char* mode)
{
    int flags = O_CLOEXEC;
    const bool update = std::strchr(mode, '+') != nullptr;
    const int write = update ? O_RDWR : O_WRONLY;
    switch (mode[0])
    {
    case 'r': flags |= update ? O_RDWR : O_RDONLY; break;
    case 'w': flags |= write | O_CREAT | O_TRUNC; break;
    case 'a': flags |= write | O_CREAT | O_APPEND; break;
    default: return -1;
    }
    if (mode[std::strspn(mode + 1, "+bexnp") + 1] != '\0')
        return -1;
    if (std::strchr(mode, 'x'))
        flags |= O_EXCL;
    if (std::strchr(mode, 'n'))
        flags |= O_NOFOLLOW | O_NONBLOCK; // the latter for a pipe, whose other end may never come
    return flags;
}

// Calls @p open, which gives a descriptor, until no signal interrupts it.
template <typename Open>
int OpenRetrying(Open open)
{
    int descriptor = -1;
    do
        descriptor = open();
    while (descriptor < 0 && errno == EINTR);
    return descriptor;
}

mode_t PermissionsOf(const char* mode)
{
    return std::strchr(mode, 'p') ? kPrivateFileMode : kFileMode;
}

// Moves @p length bytes with @p transfer, which is read() or write(), in as many calls as the
// system wants; fewer at the end of the file or on an error.
template <typename Transfer>
std::size_t TransferAll(Transfer transfer, std::size_t length)
{
    std::size_t done = 0;
    while (done < length)
    {
        const ssize_t moved = transfer(done, length - done);
        if (moved < 0 && errno == EINTR)
            continue;
        if (moved <= 0)
            break;
        done += static_cast<std::size_t>(moved);
    }
    return done;
}

bool FitsInMemory(std::size_t size, std::size_t count)
{
    return size != 0 && count <= SIZE_MAX / size;
}

} // namespace

File::~File()
{
    Close();
}

bool File::Construct(const String* path, const char* mode, bool createParents)
{
    Close();
    const int flags = path && mode ? OpenFlags(mode) : -1;
    if (flags < 0)
    {
        errno = EINVAL;
        return false;
    }
    if (createParents)
        MakeParentFolders(path->Get());
    m_descriptor = OpenRetrying([&] { return open(path->Get(), flags, PermissionsOf(mode)); });
    return m_descriptor >= 0;
}

bool File::ConstructIn(int folder, const char* name, const char* mode)
{
    Close();
    const int flags = name && mode ? OpenFlags(mode) : -1;
    if (flags < 0)
    {
        errno = EINVAL;
        return false;
    }
    m_descriptor = OpenRetrying([&] { return openat(folder, name, flags, PermissionsOf(mode)); });
    return m_descriptor >= 0;
}

std::size_t File::Read(void* buffer, std::size_t size, std::size_t count)
{
    if (!FitsInMemory(size, count))
        return 0;
    const auto transfer = [&](std::size_t at, std::size_t length)
    { return read(m_descriptor, static_cast<char*>(buffer) + at, length); };
    return TransferAll(transfer, size * count) / size;
}

std::size_t File::ReadSome(void* buffer, std::size_t size)
{
    ssize_t got = -1;
    do
        got = read(m_descriptor, buffer, size);
    while (got < 0 && errno == EINTR);
    return got < 0 ? 0 : static_cast<std::size_t>(got);
}

std::size_t File::Write(const void* buffer, std::size_t size, std::size_t count)
{
    if (!FitsInMemory(size, count))
        return 0;
    const auto transfer = [&](std::size_t at, std::size_t length)
    { return write(m_descriptor, static_cast<const char*>(buffer) + at, length); };
    return TransferAll(transfer, size * count) / size;
}

int File::Close()
{
    if (m_descriptor < 0)
        return 0;
    // Not tried again after a failure: the number is free then and may be another thread's already.
    const int result = close(m_descriptor);
    m_descriptor = -1;
    return result;
}

int File::IsAccessible(const char* path, int mode)
{
    if (!path)
    {
        errno = EINVAL;
        return -1;
    }
    return access(path, mode);
}

int File::Unlink(const String* path)
{
    return Unlink(path ? path->Get() : nullptr);
}

int File::Unlink(const char* path)
{
    if (!path)
    {
        errno = EINVAL;
        return -1;
    }
    return unlink(path);
}

} // namespace Nib
