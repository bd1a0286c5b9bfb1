#ifndef NIB_TESTS_HOSTILE_FILES_H
#define NIB_TESTS_HOSTILE_FILES_H

#include <cstddef>
#include <iosfwd>
#include <string>
#include <vector>

/// A kind of file that tries to make its reader fail, grow or stall.
struct HostileFile
{
    const char* name;
    /// A file of this kind with so many of what there is much of, a few bytes each.
    std::string (*make)(std::size_t count);
    /// What the reader says of it, behind file and line, however large it is; null where it is read,
    /// or refused only beyond a size.
    const char* problem;
};

void PrintTo(const HostileFile& file, std::ostream* out); // for the names of tests

const std::vector<HostileFile>& HostileFiles();

/// @p count times @p text.
std::string Repeated(std::size_t count, const std::string& text);

#endif
