#ifndef NIB_TESTS_SOAK_FAILURE_H
#define NIB_TESTS_SOAK_FAILURE_H

#include <stdexcept>
#include <string>

namespace Soak
{

/// What was promised and did not hold.
class Failure : public std::runtime_error
{
public:
    using std::runtime_error::runtime_error;
};

inline void Require(bool holds, const std::string& what)
{
    if (!holds)
        throw Failure(what);
}

} // namespace Soak

#endif
