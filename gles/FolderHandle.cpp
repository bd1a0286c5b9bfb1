#include "gles/FolderHandle.h"

#include <fcntl.h>
#include <unistd.h>

namespace Nib
{

FolderHandle::~FolderHandle()
{
    Drop();
}

void FolderHandle::Hold(const std::string& path)
{
    Drop();
    m_descriptor = open(path.c_str(), O_PATH | O_DIRECTORY | O_NOFOLLOW | O_CLOEXEC);
}

bool FolderHandle::OpenToRead(File& file, const std::string& name) const
{
    return m_descriptor >= 0 && file.ConstructIn(m_descriptor, name.c_str(), "rbn");
}

void FolderHandle::Drop()
{
    if (m_descriptor >= 0)
        close(m_descriptor);
    m_descriptor = -1;
}

} // namespace Nib
