#ifndef NIB_TOOLS_USER_ERROR_H
#define NIB_TOOLS_USER_ERROR_H

#include <stdexcept>

/// Something that the user can mend. Printed as "nib: what()", exit status 2.
class UserError : public std::runtime_error
{
public:
    using std::runtime_error::runtime_error;
};

#endif
