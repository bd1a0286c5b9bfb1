#ifndef NIB_DEVICE_GLTEXT_H
#define NIB_DEVICE_GLTEXT_H

#include <GLES3/gl3.h>

#include <cstring>

namespace Nib
{

/// One of the driver's texts; null without a current context, and where a driver fails to answer.
inline const char* GetGlText(GLenum name)
{
    return reinterpret_cast<const char*>(glGetString(name));
}

/// Whether @p part occurs in @p text. A driver's text may be null; it then holds nothing.
inline bool Contains(const char* text, const char* part)
{
    return text != nullptr && std::strstr(text, part) != nullptr;
}

/// @p text as a log line shows it.
inline const char* Printable(const char* text)
{
    return text != nullptr ? text : "(null)";
}

} // namespace Nib

#endif
