#ifndef NIB_GLES_INVALID_ARGUMENT_H
#define NIB_GLES_INVALID_ARGUMENT_H

#include "base/Log.h"

#include <nib/exceptions.h>

#include <string>

namespace Nib::GLES
{

/// Writes @p message as an ERROR line and throws it.
[[noreturn]] inline void ThrowInvalidArgument(const std::string& message)
{
    NIB_LOG_ERROR("%s", message.c_str());
    throw InvalidArgumentException(message);
}

} // namespace Nib::GLES

#endif
