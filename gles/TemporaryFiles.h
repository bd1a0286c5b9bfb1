#ifndef NIB_GLES_TEMPORARY_FILES_H
#define NIB_GLES_TEMPORARY_FILES_H

#include <string>

namespace Nib
{

/// A name beside @p path under which no other thread or process writes: PATH.PROCESS.NUMBER.tmp
std::string TemporaryName(const std::string& path);

/// Removes from @p directory what TemporaryName named, of writers that have ended. Call it before
/// this process writes its first file there: one with this process's own number then is of an
/// earlier process that had the same.
void RemoveStaleTemporaries(const std::string& directory);

} // namespace Nib

#endif
