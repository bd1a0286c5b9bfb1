#ifndef NIB_EXCEPTIONS_H
#define NIB_EXCEPTIONS_H

/// @file
/// What the library throws on programming errors. The message stands in the log as an ERROR line
/// before the exception is thrown.

#include <nib/export.h>

#include <exception>
#include <stdexcept>
#include <string>

namespace Nib
{

/// An argument that no call may have, or a shader that does not compile or link.
class NIB_EXPORT InvalidArgumentException : public std::exception
{
public:
    /// @p message is what what() gives.
    explicit InvalidArgumentException(const std::string& message);
    ~InvalidArgumentException() override;

    /// The message.
    const char* what() const noexcept override; ///< the text of the exception

private:
    std::runtime_error m_message; // copies without allocating
};

/// "Functionality are not supported!"
class NIB_EXPORT NotSupportedException : public std::exception
{
public:
    ~NotSupportedException() override;
    const char* what() const noexcept override; ///< the text of the exception
};

/// "Required OpenGL version not supported!"
class NIB_EXPORT OGLVersionNotSupportedException : public std::exception
{
public:
    ~OGLVersionNotSupportedException() override;
    const char* what() const noexcept override; ///< the text of the exception
};

/// "Texture is corrupted or doesn't exist!"
class NIB_EXPORT TextureNotValidException : public std::exception
{
public:
    ~TextureNotValidException() override;
    const char* what() const noexcept override; ///< the text of the exception
};

} // namespace Nib

#endif
