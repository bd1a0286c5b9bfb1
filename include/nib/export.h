#ifndef NIB_EXPORT_H
#define NIB_EXPORT_H

/// @file
/// The one macro that marks what the shared libraries export; everything else is hidden.

/// Marks what a shared library of the toolkit exports.
#define NIB_EXPORT __attribute__((visibility("default")))

#endif
