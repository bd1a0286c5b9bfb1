#ifndef NIB_GLES_SYMBOLIC_LINK_H
#define NIB_GLES_SYMBOLIC_LINK_H

namespace Nib
{

/// Whether @p path itself is a symbolic link, wherever that leads.
bool IsSymbolicLink(const char* path);

} // namespace Nib

#endif
