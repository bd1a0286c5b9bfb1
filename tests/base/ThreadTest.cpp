#include "sim/SimDriver.h"

#include <nib/base.h>

#include <gtest/gtest.h>

#include <cerrno>
#include <string>

#include <sys/resource.h>
#include <sys/syscall.h>
#include <unistd.h>

using namespace Nib;

namespace
{

/// What a thread found out about itself.
struct Findings
{
    int runs = 0;
    std::string name;
    int nice = 0;
    Thread::Handle handle = 0;
    pthread_t posixHandle{};
    std::uint64_t id = 0;
};

void LookAround(void* argument)
{
    auto* findings = static_cast<Findings*>(argument);
    ++findings->runs;
    char name[16] = {};
    pthread_getname_np(pthread_self(), name, sizeof name);
    findings->name = name;
    findings->nice = getpriority(PRIO_PROCESS, 0);
    findings->handle = Thread::self();
    findings->posixHandle = pthread_self();
    findings->id = GetNibCurrentThreadId();
}

Findings FindingsOf(const char* name, Thread::ThreadPriority priority)
{
    Findings findings;
    Thread thread(&LookAround, &findings, name, priority);
    EXPECT_TRUE(thread.start());
    thread.join();
    return findings;
}

} // namespace

TEST(Thread, RunsItsProcedureOnceWithTheArgument)
{
    EXPECT_EQ(FindingsOf("worker", 0).runs, 1);
}

TEST(Thread, DoesNotRunBeforeItIsStarted)
{
    Findings findings;
    {
        Thread thread(&LookAround, &findings, "worker", 0);
    }
    EXPECT_EQ(findings.runs, 0);
}

TEST(Thread, JoinReturnsAtOnceWhenNothingWasStarted)
{
    Findings findings;
    Thread thread(&LookAround, &findings, "worker", 0);
    thread.join();
    EXPECT_EQ(findings.runs, 0);
}

TEST(Thread, IsNotStartedTwice)
{
    Findings findings;
    Thread thread(&LookAround, &findings, "worker", 0);
    EXPECT_TRUE(thread.start());
    EXPECT_FALSE(thread.start());
    thread.join();
    EXPECT_EQ(findings.runs, 1);
}

TEST(Thread, StartsAgainAfterJoin)
{
    Findings findings;
    Thread thread(&LookAround, &findings, "worker", 0);
    EXPECT_TRUE(thread.start());
    thread.join();
    EXPECT_TRUE(thread.start());
    thread.join();
    EXPECT_EQ(findings.runs, 2);
}

TEST(Thread, DestructorJoins)
{
    Findings findings;
    {
        Thread thread(&LookAround, &findings, "worker", 0);
        EXPECT_TRUE(thread.start());
    }
    EXPECT_EQ(findings.runs, 1);
}

TEST(Thread, StartIsFalseWhenTheSystemRefuses)
{
    SimDriver driver;
    driver.FailNext("pthread_create", EAGAIN);
    Findings findings;
    Thread thread(&LookAround, &findings, "worker", 0);

    EXPECT_FALSE(thread.start());
    thread.join();
    EXPECT_EQ(findings.runs, 0);

    EXPECT_TRUE(thread.start());
    thread.join();
    EXPECT_EQ(findings.runs, 1);
}

TEST(Thread, CarriesItsName)
{
    EXPECT_EQ(FindingsOf("ink", 0).name, "ink");
}

TEST(Thread, ALongNameIsCutToFifteenBytes)
{
    EXPECT_EQ(FindingsOf("RenderThreadLowRenderPriority", 0).name, "RenderThreadLow");
}

TEST(Thread, WithoutANameInheritsOne)
{
    char name[16] = {};
    pthread_getname_np(pthread_self(), name, sizeof name);
    EXPECT_EQ(FindingsOf(nullptr, 0).name, name);
}

TEST(Thread, AppliesItsPriorityToItselfAlone)
{
    const int before = getpriority(PRIO_PROCESS, 0);

    EXPECT_EQ(FindingsOf("worker", 10).nice, 10);

    EXPECT_EQ(getpriority(PRIO_PROCESS, 0), before);
}

TEST(Thread, RunsAlsoWhenItsPriorityIsRefused)
{
    const int inherited = getpriority(PRIO_PROCESS, 0);

    const Findings findings = FindingsOf("worker", -10);

    EXPECT_EQ(findings.runs, 1);
    EXPECT_TRUE(findings.nice == -10 || findings.nice == inherited) << findings.nice;
}

TEST(Thread, HandlesTellThreadsApart)
{
    const Findings other = FindingsOf("worker", 0);

    EXPECT_NE(other.handle, 0);
    EXPECT_EQ(other.handle, static_cast<Thread::Handle>(other.posixHandle));
    EXPECT_EQ(Thread::self(), static_cast<Thread::Handle>(pthread_self()));
    EXPECT_NE(Thread::self(), other.handle);
}

TEST(Thread, NumbersAreTheSystems)
{
    const Findings other = FindingsOf("worker", 0);

    EXPECT_EQ(GetNibCurrentThreadId(), static_cast<std::uint64_t>(syscall(SYS_gettid)));
    EXPECT_NE(other.id, 0u);
    EXPECT_NE(other.id, GetNibCurrentThreadId());
}
