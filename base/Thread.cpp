#include <nib/base.h>

#include <cstdio>

#include <sys/resource.h>
#include <unistd.h>

namespace Nib
{

namespace
{

void NameCallingThread(const char* name)
{
    char shown[16]; // the system's limit; a longer name would be refused, not cut
    std::snprintf(shown, sizeof shown, "%s", name);
    pthread_setname_np(pthread_self(), shown);
}

void ApplyToCallingThread(Thread::ThreadPriority priority)
{
    // 0 is the calling thread alone: nice values belong to threads here, not to the process.
    setpriority(PRIO_PROCESS, 0, priority);
}

} // namespace

Thread::Thread(Procedure procedure, void* argument, const char* name,
               ThreadPriority priority) noexcept
    : m_procedure(procedure), m_argument(argument), m_name(name), m_priority(priority)
{
}

Thread::~Thread()
{
    join();
}

bool Thread::start() noexcept
{
    if (m_started)
        return false;
    m_started = pthread_create(&m_thread, nullptr, &Thread::Run, this) == 0;
    return m_started;
}

void Thread::join() noexcept
{
    if (!m_started)
        return;
    pthread_join(m_thread, nullptr);
    m_started = false;
}

void* Thread::Run(void* thread)
{
    Thread* self = static_cast<Thread*>(thread);
    if (self->m_name)
        NameCallingThread(self->m_name);
    ApplyToCallingThread(self->m_priority);
    self->m_procedure(self->m_argument);
    return nullptr;
}

Thread::Handle Thread::self() noexcept
{
    return static_cast<Handle>(pthread_self());
}

std::uint64_t GetNibCurrentThreadId() noexcept
{
    return static_cast<std::uint64_t>(gettid());
}

} // namespace Nib
