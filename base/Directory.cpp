#include "base/Folders.h"

#include <nib/base.h>

#include <cerrno>
#include <string>

#include <sys/stat.h>

namespace Nib
{

int Directory::MakeDirectory(const char* path)
{
    if (!path)
    {
        errno = EINVAL;
        return -1;
    }
    return mkdir(path, S_IRWXU);
}

void MakeParentFolders(const char* path)
{
    std::string parent = path;
    // From 1: the root needs no making.
    for (std::size_t end = parent.find('/', 1); end != std::string::npos;
         end = parent.find('/', end + 1))
    {
        parent[end] = '\0';
        Directory::MakeDirectory(parent.c_str());
        parent[end] = '/';
    }
}

} // namespace Nib
