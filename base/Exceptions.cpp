#include <nib/exceptions.h>

// The destructors stand here, so that each class has its type information in this library alone and
// is caught across libraries.

namespace Nib
{

InvalidArgumentException::InvalidArgumentException(const std::string& message) : m_message(message)
{
}

InvalidArgumentException::~InvalidArgumentException() = default;

const char* InvalidArgumentException::what() const noexcept
{
    return m_message.what();
}

NotSupportedException::~NotSupportedException() = default;

const char* NotSupportedException::what() const noexcept
{
    return "Functionality are not supported!";
}

OGLVersionNotSupportedException::~OGLVersionNotSupportedException() = default;

const char* OGLVersionNotSupportedException::what() const noexcept
{
    return "Required OpenGL version not supported!";
}

TextureNotValidException::~TextureNotValidException() = default;

const char* TextureNotValidException::what() const noexcept
{
    return "Texture is corrupted or doesn't exist!";
}

} // namespace Nib
