#ifndef NIB_TESTS_SOAK_MEMORY_RECORD_H
#define NIB_TESTS_SOAK_MEMORY_RECORD_H

#include <cstddef>
#include <string>
#include <vector>

namespace Soak
{

/// The resident memory behind each round, and whether it grew. The first third of the rounds is the
/// warm-up; what a driver keeps for later comes and goes, so that medians are compared.
class MemoryRecord
{
public:
    void Add(long kib) { m_kib.push_back(kib); }

    bool CanBeJudged() const;
    long Begin() const; ///< KiB, behind the warm-up
    long End() const;
    bool IsFlat() const; ///< the end is at most 1 % above the beginning

    /// "begin to end", for people.
    std::string Text() const;

private:
    long Median(std::size_t from) const;

    std::vector<long> m_kib;
};

} // namespace Soak

#endif
