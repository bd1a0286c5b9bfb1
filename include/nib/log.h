#ifndef NIB_LOG_H
#define NIB_LOG_H

/// @file
/// The library's log lines for the application, besides the system's log.

#include <nib/export.h>

namespace Nib
{

/// Takes one line of the library, on the thread that wrote it; several threads may call at once.
/// @param context  what SetLogSink was given
/// @param priority 3 debug, 4 info, 5 warning, 6 error (android_LogPriority)
/// @param message  the text, without a line end; valid during the call
/// It must not call SetLogSink, nor throw; what it makes the library log does not come back to it.
using LogSink = void (*)(void* context, int priority, const char* message);

/// Hands the library's lines of @p lowestPriority and above to @p sink from now on; they go to the
/// system's log as well, filtered as before. There is one sink; null ends it. When the call
/// returns, the sink that was there before is called no more.
///
/// On Linux the lines come from NibBase's __android_log_print: a program that brings a function of
/// that name has all lines already. On Android the system hands them over from API level 30 on.
/// Any thread.
/// @return false, with nothing changed, where the system cannot hand lines over
NIB_EXPORT bool SetLogSink(LogSink sink, void* context, int lowestPriority = 4);

} // namespace Nib

#endif
