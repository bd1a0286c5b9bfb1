// The lock that keeps other threads out while the UI draws.

#include "render/HWUITestSupport.h"

#include <nib/base.h>

#include <stdexcept>

using namespace Nib;

namespace
{

class SafeLock : public HwuiTest
{
protected:
    RenderThreadHWUI::ISafeLock* Lock() { return thread->GetSafeLock(); }

    /// Takes the lock on another thread, and says when it has it.
    std::thread LockElsewhere(Event& locked)
    {
        return std::thread(
            [&]
            {
                Lock()->Lock(false);
                locked.Set();
                Lock()->Unlock();
            });
    }
};

TEST_F(SafeLock, IsTakenAndFreed)
{
    Lock()->Lock(false);
    Lock()->Unlock();

    Event locked;
    LockElsewhere(locked).join();
    EXPECT_TRUE(locked.IsSet());
}

TEST_F(SafeLock, IsFreedWhenEachLockHasHadItsUnlock)
{
    Lock()->Lock(false);
    Lock()->Lock(false);
    Event locked;
    std::thread other = LockElsewhere(locked);

    Lock()->Unlock();
    EXPECT_FALSE(locked.IsSet()); // still ours
    Lock()->Unlock();
    locked.Wait();

    other.join();
}

TEST_F(SafeLock, MayBeTakenAgainByItsOwnerInEitherWay)
{
    Lock()->Lock(true);
    Lock()->Lock(false);
    Lock()->Lock(true);

    Lock()->Unlock();
    Lock()->Unlock();
    Lock()->Unlock();

    EXPECT_THROW(Lock()->Unlock(), std::logic_error);
}

TEST_F(SafeLock, UnlockElsewhereThrowsAndChangesNothing)
{
    Lock()->Lock(false);
    const auto owner = static_cast<long>(Thread::self());
    driver.ForgetLog();
    std::string thrown;
    long caller = 0;

    std::thread(
        [&]
        {
            caller = static_cast<long>(Thread::self());
            try
            {
                Lock()->Unlock();
            }
            catch (const std::logic_error& error)
            {
                thrown = error.what();
            }
        })
        .join();

    EXPECT_EQ(thrown, "HWUI Safelock: Unlock should be called on owner thread");
    EXPECT_EQ(LinesWith(driver, ""),
              Lines({"E virtual void Nib::GLES::HWUIThreadGLImpl::Unlock() HWUI Safelock: Must be "
                     "unlocked on owner thread(" +
                     std::to_string(owner) + ") but called on " + std::to_string(caller)}));
    EXPECT_NO_THROW(Lock()->Unlock());
}

TEST_F(SafeLock, UnlockOfAFreeLockThrows)
{
    driver.ForgetLog();

    EXPECT_THROW(Lock()->Unlock(), std::logic_error);

    EXPECT_EQ(driver.CountLogContaining("Must be unlocked on owner thread(0) but called on "), 1u);
    EXPECT_TRUE(thread->Render()); // the locks inside are free
}

TEST_F(SafeLock, KeepsThreadsApart)
{
    int guarded = 0; // no lock but this one
    std::vector<std::thread> users;
    for (int i = 0; i < 8; ++i)
    {
        users.emplace_back(
            [&]
            {
                for (int round = 0; round < 2000; ++round)
                {
                    Lock()->Lock(false);
                    Lock()->Lock(false);
                    ++guarded;
                    Lock()->Unlock();
                    Lock()->Unlock();
                }
            });
    }
    for (std::thread& user : users)
        user.join();

    EXPECT_EQ(guarded, 16000);
}

TEST_F(SafeLock, DoesNotStopFramesOrTasks)
{
    Event locked;
    Event free;
    std::thread owner(
        [&]
        {
            Lock()->Lock(false);
            locked.Set();
            free.Wait();
            Lock()->Unlock();
        });
    locked.Wait();
    int ran = 0;
    Post(Queue(), [&] { ++ran; });

    EXPECT_TRUE(thread->Render());

    EXPECT_EQ(ran, 1);
    free.Set();
    owner.join();
}

/// An owner that waits for its tasks while it holds the lock, and then frees it.
class WaitingOwner
{
public:
    WaitingOwner(GLES::HWUIThreadGLImpl& thread, std::function<void()> task)
        : m_thread(
              [this, &thread, task = std::move(task)]
              {
                  thread.GetSafeLock()->Lock(false);
                  locked.Set();
                  goOn.Wait();
                  Post(thread.GetMsgQueue(), task);
                  waited = thread.GetMsgQueue()->waitForCompleting();
                  thread.GetSafeLock()->Unlock();
              })
    {
    }
    ~WaitingOwner() { m_thread.join(); }

    Event locked;
    Event goOn;
    std::atomic<bool> waited{false};

private:
    std::thread m_thread;
};

TEST_F(SafeLock, TheUiDrawsForAnOwnerThatWaitsForItsTasks)
{
    thread->Render();
    std::atomic<int> ran{0};
    std::atomic<bool> onTheUisThread{false};
    const auto ui = std::this_thread::get_id();
    WaitingOwner owner(*thread,
                       [&]
                       {
                           ++ran;
                           onTheUisThread = std::this_thread::get_id() == ui;
                       });
    owner.locked.Wait();
    owner.goOn.Set();

    Lock()->Lock(true); // both waits cross: neither may be for ever

    EXPECT_EQ(ran, 1);
    EXPECT_TRUE(onTheUisThread);
    EXPECT_TRUE(owner.waited);
    Lock()->Unlock();
}

TEST_F(SafeLock, AnOwnerThatWaitsWhileTheUiDoesAsksForNoFrame)
{
    thread->Render();
    ready = false; // a request would end the owner's wait with false
    std::atomic<int> ran{0};
    bool uiWaits = false;
    std::optional<WaitingOwner> owner;
    owner.emplace(*thread, [&] { ++ran; });
    owner->locked.Wait();
    // The UI's thread is inside Lock(true) once it has said that it wants the lock, which no call
    // shows; a wait that comes too early is refused, and is tried again.
    std::thread tries(
        [&]
        {
            while (!Queue()->waitForCompleting())
                std::this_thread::yield();
            uiWaits = true;
            requests = 0;
            owner->goOn.Set();
        });

    Lock()->Lock(true);

    tries.join();
    EXPECT_TRUE(uiWaits);
    EXPECT_EQ(requests, 0);
    EXPECT_TRUE(owner->waited);
    EXPECT_EQ(ran, 1);
    Lock()->Unlock();
    owner.reset();
}

TEST_F(SafeLock, WaitsAreRequestsAgainOnceTheUiHasTheLock)
{
    thread->Render();
    {
        WaitingOwner owner(*thread, [] {});
        owner.locked.Wait();
        owner.goOn.Set();
        Lock()->Lock(true);
        Lock()->Unlock();
    }
    requests = 0;
    ready = false;

    bool waited = true;
    std::thread([&] { waited = Queue()->waitForCompleting(); }).join();

    EXPECT_FALSE(waited); // refused, so it was asked for
    EXPECT_EQ(requests, 1);
}

TEST_F(SafeLock, AnOwnerThatWaitsWhileAnotherThreadDoesAsksForFramesAllTheSame)
{
    constexpr int kTries = 300;
    thread->Render();
    ready = false; // every request is refused, so that no wait needs a frame
    int refused = 0;
    std::atomic<bool> done{false};
    std::thread owner(
        [&]
        {
            Lock()->Lock(false);
            Event otherComes;
            std::thread other(
                [&]
                {
                    otherComes.Set();
                    Lock()->Lock(false);
                    Lock()->Unlock();
                });
            otherComes.Wait();
            for (int i = 0; i < kTries; ++i)
            {
                refused += Queue()->waitForCompleting() ? 0 : 1;
                std::this_thread::yield();
            }
            Lock()->Unlock();
            other.join();
            done = true;
        });

    while (!done)
    {
        thread->Render(); // a wait that no request was made for would last until a frame
        std::this_thread::yield();
    }

    owner.join();
    EXPECT_EQ(refused, kTries);
    EXPECT_EQ(requests, kTries);
}

TEST_F(SafeLock, AskedForOrdinarilyTheUiDoesNotDraw)
{
    thread->Render();
    Event locked;
    Event free;
    std::thread owner(
        [&]
        {
            Lock()->Lock(false);
            locked.Set();
            free.Wait();
            Lock()->Unlock();
        });
    locked.Wait();
    driver.ForgetLog();
    std::thread freer([&] { free.Set(); });

    Lock()->Lock(false);

    EXPECT_EQ(driver.CountLogContaining("::Render()"), 0u);
    Lock()->Unlock();
    freer.join();
    owner.join();
}

TEST_F(SafeLock, SurvivesOwnersThatWaitAndAUiThatLocksOverAndOver)
{
    thread->Render();
    driver.RecordCalls(false);
    constexpr int kOwners = 4;
    constexpr int kRounds = 100;
    std::atomic<int> left{kOwners};
    std::atomic<int> ran{0};
    std::vector<std::thread> owners;
    for (int i = 0; i < kOwners; ++i)
    {
        owners.emplace_back(
            [&]
            {
                for (int round = 0; round < kRounds; ++round)
                {
                    Lock()->Lock(false);
                    Post(Queue(), [&] { ++ran; });
                    EXPECT_TRUE(Queue()->waitForCompleting());
                    Lock()->Unlock();
                }
                --left;
            });
    }

    while (left > 0)
    {
        Lock()->Lock(true);
        Lock()->Unlock();
        thread->Render();
    }
    for (std::thread& owner : owners)
        owner.join();
    thread->Render();

    EXPECT_EQ(ran, kOwners * kRounds);
}

} // namespace
