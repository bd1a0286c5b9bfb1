#ifndef NIB_BASE_FOLDERS_H
#define NIB_BASE_FOLDERS_H

namespace Nib
{

/// Makes the folders that stand before the last '/' of @p path, where they are missing. What cannot
/// be made is seen by whoever uses the path.
void MakeParentFolders(const char* path);

} // namespace Nib

#endif
