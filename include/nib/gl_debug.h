#ifndef NIB_GL_DEBUG_H
#define NIB_GL_DEBUG_H

/// @file
/// A debugging aid: what the GL driver has to say, and names for what it shows to a GL debugger.

#include <nib/export.h>

namespace Nib
{

/// Has render threads use GL_KHR_debug, where the driver has it. Off by default; the environment
/// variable NIB_GL_DEBUG=1 turns it on. While it is off, no GL or EGL call is made for it.
///
/// In a context that a render thread makes while it is on:
/// - each message of the driver is a line in the log, written in the call that caused it: ERROR for
///   a severity of high, WARN for medium, INFO for low, DEBUG for a mere notification;
/// - each task is a debug group with the name of its type;
/// - textures have their tags as labels, render targets those of their textures, programs their keys
///   in the program cache, and buffers what they hold.
///
/// The context is made as a debugging one, where EGL has that. A render thread inside the Android
/// UI names groups and objects, but leaves the messages of the context that it borrows alone.
class NIB_EXPORT GlDebug
{
public:
    /// For the contexts that are made, or made again after a loss, from now on. Goes before the
    /// environment. Any thread.
    static void SetEnabled(bool enabled);

    /// Whether they will have it. Any thread.
    static bool IsEnabled();

    /// Labels an object that the application has made itself. Nothing where the current context has
    /// no debugging aids. On the render thread.
    /// @param identifier GL_BUFFER_KHR, GL_PROGRAM_KHR, GL_SHADER_KHR, GL_TEXTURE, GL_SAMPLER,
    ///                   GL_FRAMEBUFFER or GL_RENDERBUFFER
    /// @param name       of an object that has been bound before, or of a program or shader
    /// @param label      copied; what is longer than 255 characters is cut, null takes a label away
    static void Label(unsigned int identifier, unsigned int name, const char* label);
};

} // namespace Nib

#endif
