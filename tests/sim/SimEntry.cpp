#include "SimEntry.h"

#include <cstdio>

namespace Sim
{

std::string Hex(unsigned value)
{
    char text[16];
    std::snprintf(text, sizeof text, "0x%04X", value);
    return text;
}

Entry::Entry(Api api, const char* name, std::initializer_list<SimValue> args)
    : state(GetState()), m_name(name), m_lock(state.mutex)
{
    m_thread = &state.CurrentThread();
    if (m_thread->quiet)
        return;
    RunAction();
    WaitWhileHeld();
    if (api != Api::Platform && ++state.callsMade == state.loseContextsAt)
        LoseContexts();
    Record(args);
    m_refused = TakeFailure(api, args);
    if (m_record)
        m_record->failed = m_refused;
}

void Entry::RunAction()
{
    if (state.actions.empty())
        return;
    const auto found = state.actions.find(m_name);
    if (found == state.actions.end())
        return;
    const std::function<void()> action = found->second;
    m_lock.unlock();
    action();
    m_lock.lock();
}

void Entry::WaitWhileHeld()
{
    if (state.held.empty() || !state.held.count(m_name))
        return;
    NoteBlocked(1);
    state.changed.wait(m_lock, [this] { return !state.held.count(m_name); });
    NoteBlocked(-1);
}

void Entry::NoteBlocked(int change)
{
    state.blocked[m_name] += change;
    state.changed.notify_all();
}

void Entry::Record(std::initializer_list<SimValue> args)
{
    if (!state.recording)
        return;
    SimCall call;
    call.name = m_name;
    call.args = args;
    call.thread = m_thread->number;
    call.context = m_thread->context ? m_thread->context->handle : nullptr;
    state.calls.push_back(std::move(call));
    m_record = &state.calls.back();
}

void Entry::LoseContexts()
{
    for (const auto& [handle, context] : state.contexts)
        context->group->lost = true;
}

bool Entry::TakeFailure(Api api, std::initializer_list<SimValue> args)
{
    if (api != Api::Platform && state.failAt != 0 && state.callsMade == state.failAt)
    {
        m_error = api == Api::Egl ? state.failAtEglError : state.failAtGlError;
        return true;
    }
    for (auto failure = state.failures.begin(); failure != state.failures.end(); ++failure)
    {
        if (failure->name != m_name)
            continue;
        if (failure->when && (failure->when->first >= args.size() ||
                              !(args.begin()[failure->when->first] == failure->when->second)))
            continue;
        m_error = failure->error;
        if (failure->times > 0 && --failure->times == 0)
            state.failures.erase(failure);
        return true;
    }
    return false;
}

void Entry::AttributeList(const EGLint* list)
{
    if (!m_record || !list)
        return;
    for (; *list != EGL_NONE; list += 2)
    {
        m_record->list.push_back(list[0]);
        m_record->list.push_back(list[1]);
    }
}

void Entry::Misuse(const std::string& text)
{
    if (m_thread->quiet || !state.driverAlive)
        return;
    const std::string line = std::string(m_name) + ": " + text;
    state.misuses.push_back(line);
    if (!state.allMisuseAllowed && !state.allowedMisuse.count(m_name))
        state.offences.emplace_back(m_name, line);
}

EglEntry::EglEntry(const char* name, std::initializer_list<SimValue> args)
    : Entry(Api::Egl, name, args)
{
    m_thread->error = m_refused ? static_cast<EGLint>(m_error) : EGL_SUCCESS;
}

EGLBoolean EglEntry::Refuse(EGLint error)
{
    m_thread->error = error;
    return EGL_FALSE;
}

EGLBoolean EglEntry::Misuse(EGLint error, const std::string& text)
{
    Entry::Misuse(text + " (" + Hex(static_cast<unsigned>(error)) + ")");
    return Refuse(error);
}

GlEntry::GlEntry(const char* name, std::initializer_list<SimValue> args, int version)
    : Entry(Api::Gl, name, args)
{
    if (!m_thread->context)
    {
        if (!m_refused)
            Entry::Misuse("no context is current");
        m_refused = true;
    }
    else if (m_refused)
    {
        SetError(m_error);
    }
    else if (Group().lost)
    {
        m_refused = true;
    }
    else if (Version() < version)
    {
        Refuse(GL_INVALID_OPERATION);
        m_refused = true;
    }
}

void GlEntry::SetError(GLenum error)
{
    // One flag, as most drivers have it: an error that nobody has read keeps later ones out. An
    // injected framebuffer status is no error.
    const bool isError = error >= GL_INVALID_ENUM && error <= GL_INVALID_FRAMEBUFFER_OPERATION;
    if (isError && Gl().errors.empty())
        Gl().errors.push_back(error);
}

bool GlEntry::HasContext() const
{
    return m_thread->context != nullptr;
}

void GlEntry::Refuse(GLenum error)
{
    SetError(error);
}

void GlEntry::Misuse(GLenum error, const std::string& text)
{
    Entry::Misuse(text + " (" + Hex(error) + ")");
    SetError(error);
}

PlatformEntry::PlatformEntry(const char* name, std::initializer_list<SimValue> args)
    : Entry(Api::Platform, name, args)
{
}

} // namespace Sim
