#ifndef NIB_SIM_ENTRY_H
#define NIB_SIM_ENTRY_H

#include "SimState.h"

// The entry points are C functions in the global name space, as libEGL and libGLESv2 have them.
#define SIM_API extern "C" __attribute__((visibility("default")))

namespace Sim
{

/// One call of an entry point, from its first line to its return: waits while calls of that name
/// are held, holds the driver's lock, records the call and decides whether an injected failure
/// refuses it.
class Entry
{
public:
    State& state;

    Entry(const Entry&) = delete;
    Entry& operator=(const Entry&) = delete;

    /// False: the call was refused, and its error is set.
    explicit operator bool() const { return !m_refused; }
    unsigned InjectedError() const { return m_error; }

    template <typename T>
    void List(const T* values, long long count)
    {
        if (m_record && values && count > 0)
            m_record->list.assign(values, values + count);
    }
    /// Up to the EGL_NONE that ends an attribute list.
    void AttributeList(const EGLint* list);
    /// Notes that this call broke a rule.
    void Misuse(const std::string& text);
    /// Gives up the lock until @p done, for a call that blocks.
    template <typename Done>
    void Wait(Done done)
    {
        m_record = nullptr; // it may move, or be forgotten, meanwhile
        if (done())
            return;
        NoteBlocked(1);
        state.changed.wait(m_lock, done);
        NoteBlocked(-1);
    }

protected:
    enum class Api
    {
        Egl,
        Gl,
        Platform
    };

    Entry(Api api, const char* name, std::initializer_list<SimValue> args);

    const char* m_name;
    std::unique_lock<std::mutex> m_lock;
    Thread* m_thread = nullptr;
    bool m_refused = false;
    unsigned m_error = 0;

private:
    /// What SimDriver::WaitUntilHeld waits for.
    void NoteBlocked(int change);
    void RunAction();
    void WaitWhileHeld();
    void LoseContexts();
    bool TakeFailure(Api api, std::initializer_list<SimValue> args);
    void Record(std::initializer_list<SimValue> args);

    SimCall* m_record = nullptr;
};

class EglEntry : public Entry
{
public:
    EglEntry(const char* name, std::initializer_list<SimValue> args);

    Thread& CallingThread() { return *m_thread; }
    /// The device cannot: sets the error, without blame. Always EGL_FALSE.
    EGLBoolean Refuse(EGLint error);
    /// A correct program does not do this: sets the error. Always EGL_FALSE.
    EGLBoolean Misuse(EGLint error, const std::string& text);
    /// Whether @p display is the display and, when asked for, initialised; else the error is set.
    bool Check(EGLDisplay display, bool initialised = true);
    /// The surface or context; null, with the error set, when there is none of that handle.
    Surface* CheckSurface(EGLSurface handle);
    Context* CheckContext(EGLContext handle);
};

class GlEntry : public Entry
{
public:
    /// @p version is the first version of OpenGL ES that has the function: 20 or 30.
    GlEntry(const char* name, std::initializer_list<SimValue> args, int version = 20);

    bool HasContext() const;
    /// Only with a context, which every call that was not refused has.
    Context& CurrentContext() { return *m_thread->context; }
    GlState& Gl() { return m_thread->context->gl; }
    ShareGroup& Group() { return *m_thread->context->group; }
    Surface* DrawSurface() { return m_thread->draw; }
    Surface* ReadSurface() { return m_thread->read; }
    unsigned ThreadNumber() const { return m_thread->number; }
    int Version() const { return state.gpu.GlVersion(); }

    void Refuse(GLenum error);
    void Misuse(GLenum error, const std::string& text);
    using Entry::Misuse;

private:
    void SetError(GLenum error);
};

/// Calls of the platform: windows, properties, libraries.
class PlatformEntry : public Entry
{
public:
    PlatformEntry(const char* name, std::initializer_list<SimValue> args);
};

/// "0x0DE1"
std::string Hex(unsigned value);

} // namespace Sim

#endif
