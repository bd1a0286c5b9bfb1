#ifndef NIB_TESTS_DRIVERS_ALLOCATION_COUNT_H
#define NIB_TESTS_DRIVERS_ALLOCATION_COUNT_H

#include <cstddef>

/// Counts the calls of operator new that the library, not the driver under it, makes on the calling
/// thread. One at a time on a thread.
class LibraryAllocations
{
public:
    LibraryAllocations();
    ~LibraryAllocations();
    LibraryAllocations(const LibraryAllocations&) = delete;
    LibraryAllocations& operator=(const LibraryAllocations&) = delete;

    std::size_t Count() const;
};

#endif
