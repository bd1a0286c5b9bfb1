#ifndef NIB_GLES_THROW_H
#define NIB_GLES_THROW_H

#include "base/Log.h"

#include <utility>

namespace Nib::GLES
{

/// Throws an exception after its message was written to the log, as all programming errors are.
template <typename Exception, typename... Arguments>
[[noreturn]] void Throw(Arguments&&... arguments)
{
    Exception exception(std::forward<Arguments>(arguments)...);
    NIB_LOG_ERROR("%s", exception.what());
    throw exception;
}

} // namespace Nib::GLES

#endif
