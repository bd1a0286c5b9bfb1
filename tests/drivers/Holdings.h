#ifndef NIB_TESTS_DRIVERS_HOLDINGS_H
#define NIB_TESTS_DRIVERS_HOLDINGS_H

#include <iosfwd>

/// What a process holds that a leak would add to. The EGL objects are counted by functions in front
/// of the driver's, so the program has to export its symbols.
struct Holdings
{
    Holdings(); ///< now

    int contexts;
    int surfaces;
    int threads;
    int files;
};

bool operator==(const Holdings& a, const Holdings& b);
std::ostream& operator<<(std::ostream& out, const Holdings& held);

/// The names of GL objects up to @p highest that the share group of the current context has in use.
int GlNamesInUse(unsigned highest);

#endif
