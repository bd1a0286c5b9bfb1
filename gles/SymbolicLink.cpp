#include "gles/SymbolicLink.h"

#include <sys/stat.h>

namespace Nib
{

bool IsSymbolicLink(const char* path)
{
    struct stat status = {};
    return lstat(path, &status) == 0 && S_ISLNK(status.st_mode);
}

} // namespace Nib
