#ifndef NIB_GLES_FOLDER_HANDLE_H
#define NIB_GLES_FOLDER_HANDLE_H

#include <nib/base.h>

#include <string>

namespace Nib
{

/// A folder that is held open, so that its files are found without asking what its path has become.
/// What is put in its place later, a link too, is not seen through the handle.
class FolderHandle
{
public:
    FolderHandle() = default;
    ~FolderHandle();
    FolderHandle(const FolderHandle&) = delete;
    FolderHandle& operator=(const FolderHandle&) = delete;

    /// Holds the folder that @p path now names, in place of the one before; none when that is no
    /// folder, or a link to one.
    void Hold(const std::string& path);

    /// Opens the file @p name of the folder to read it, unless it is a link. False without a folder.
    bool OpenToRead(File& file, const std::string& name) const;

private:
    void Drop();

    int m_descriptor = -1;
};

} // namespace Nib

#endif
