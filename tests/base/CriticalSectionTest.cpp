#include <nib/base.h>

#include <gtest/gtest.h>

#include <string>
#include <thread>
#include <vector>

using namespace Nib;

namespace
{

constexpr bool kReentrant = true;

// Ready before any code runs: the compiler refuses this line otherwise.
constinit CriticalSection g_static(!kReentrant);

void AddInside(CriticalSection& section, int& sum)
{
    section.Enter();
    ++sum;
    section.Leave();
}

/// Adds to a plain int from four threads, with @p add inside the lock.
template <typename Add>
void AddFromFourThreads(Add add)
{
    std::vector<std::thread> threads;
    for (int i = 0; i < 4; ++i)
    {
        threads.emplace_back(
            [&]
            {
                for (int n = 0; n < 20000; ++n)
                    add();
            });
    }
    for (std::thread& thread : threads)
        thread.join();
}

} // namespace

TEST(CriticalSection, LetsOneThreadInAtATime)
{
    CriticalSection section(!kReentrant);
    int sum = 0;
    AddFromFourThreads(
        [&]
        {
            section.Enter();
            ++sum;
            section.Leave();
        });
    EXPECT_EQ(sum, 80000);
}

TEST(CriticalSection, LetsItsOwnerInAgain)
{
    CriticalSection section(kReentrant);
    int sum = 0;
    AddFromFourThreads(
        [&]
        {
            const AutoCriticalSection outer(section);
            AddInside(section, sum);
            ++sum; // still inside
        });
    EXPECT_EQ(sum, 160000);
}

TEST(CriticalSection, IsReentrantUnlessToldOtherwise)
{
    CriticalSection section;
    int sum = 0;
    const AutoCriticalSection outer(section);
    AddInside(section, sum);
    EXPECT_EQ(sum, 1);
}

TEST(CriticalSection, WorksAsAStaticObject)
{
    int sum = 0;
    AddFromFourThreads(
        [&]
        {
            const AutoCriticalSection lock(g_static);
            ++sum;
        });
    EXPECT_EQ(sum, 80000);
}

TEST(AutoCriticalSection, HoldsTheLockForItsLife)
{
    CriticalSection section(!kReentrant);
    int sum = 0;
    AddFromFourThreads(
        [&]
        {
            const AutoCriticalSection lock(&section);
            ++sum;
        });
    EXPECT_EQ(sum, 80000);
}

TEST(AutoCriticalSection, CarriesItsLabel)
{
    CriticalSection section(!kReentrant);
    const AutoCriticalSection lock(section, "addLookup", 42);
    EXPECT_EQ(std::string(lock.GetFunction()), "addLookup");
    EXPECT_EQ(lock.GetLine(), 42);
}

TEST(AutoCriticalSection, HasNoLabelUnlessGivenOne)
{
    CriticalSection section(!kReentrant);
    const AutoCriticalSection lock(section);
    EXPECT_EQ(lock.GetFunction(), nullptr);
    EXPECT_EQ(lock.GetLine(), 0);
}
