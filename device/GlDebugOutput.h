#ifndef NIB_DEVICE_GL_DEBUG_OUTPUT_H
#define NIB_DEVICE_GL_DEBUG_OUTPUT_H

#include <GLES3/gl3.h>
// The extension header builds on the one before.
#include <GLES2/gl2ext.h>

#include <atomic>

namespace Nib
{

/// The debugging aids of the contexts that are current on render threads.
class GlDebugOutput
{
public:
    /// Of whom a context is, and so what may be changed in it.
    enum class Owner
    {
        RenderThread,
        Borrowed
    };

    /// Turns the aids on in the calling thread's context, when they are wanted and there.
    static void Attach(Owner owner);

    /// The calling thread's context goes, or is given back.
    static void Detach();

    /// Whether the calling thread's context has them: one look at a number while none has.
    static bool IsOn() { return s_contexts.load(std::memory_order_relaxed) > 0 && IsOnHere(); }

    /// Labels an object of the calling thread's context, when it has the aids. @p label is not
    /// looked at otherwise.
    static void Label(GLenum identifier, GLuint name, const char* label)
    {
        if (IsOn())
            SetLabel(identifier, name, label);
    }

private:
    static void SetAttached(bool attached);
    static bool IsOnHere();
    static void SetLabel(GLenum identifier, GLuint name, const char* label);

    // Relaxed: a thread's own context is counted by that thread.
    static std::atomic<int> s_contexts;
};

} // namespace Nib

#endif
