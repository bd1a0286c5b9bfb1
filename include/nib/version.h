#ifndef NIB_VERSION_H
#define NIB_VERSION_H

/// @file
/// The version of the library: of the headers at compile time, of the loaded library at run time.
/// Versions follow Semantic Versioning 2.0.0 (https://semver.org): programs built with version
/// 1.x run with any later 1.y.

#include <nib/export.h>

#define NIB_VERSION_MAJOR 1 ///< Grows when programs have to be changed or rebuilt.
#define NIB_VERSION_MINOR 0 ///< Grows when something is added.
#define NIB_VERSION_PATCH 0 ///< Grows when something is mended.

/// One number for comparisons: `#if NIB_VERSION >= NIB_VERSION_NUMBER(1, 2, 0)`.
#define NIB_VERSION_NUMBER(major, minor, patch) ((major)*10000 + (minor)*100 + (patch))

/// The version of these headers as such a number.
#define NIB_VERSION NIB_VERSION_NUMBER(NIB_VERSION_MAJOR, NIB_VERSION_MINOR, NIB_VERSION_PATCH)

#define NIB_VERSION_QUOTE(text) #text
#define NIB_VERSION_JOIN(major, minor, patch)                                                      \
    NIB_VERSION_QUOTE(major) "." NIB_VERSION_QUOTE(minor) "." NIB_VERSION_QUOTE(patch)

/// The version of these headers as a text, such as "1.0.0".
#define NIB_VERSION_STRING NIB_VERSION_JOIN(NIB_VERSION_MAJOR, NIB_VERSION_MINOR, NIB_VERSION_PATCH)

namespace Nib
{

/// The version of the library that is loaded, such as "1.0.0"; it differs from NIB_VERSION_STRING
/// when a program runs with another library than it was compiled for. The text lives as long as
/// the library is loaded. Any thread.
NIB_EXPORT const char* GetVersionString() noexcept;

} // namespace Nib

#endif
