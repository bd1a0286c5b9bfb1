#include "gles/BoundQueue.h"
#include "sim/SimDriver.h"

#include <gtest/gtest.h>

#include <memory>
#include <stdexcept>
#include <string>
#include <thread>
#include <vector>

// Not in an unnamed namespace, so that type names are the same under every compiler.
namespace ManagedObjectTypes
{

using Texts = std::vector<std::string>;

/// A GL object without GL: counts, and does what the test wants on the way.
class Thing : public Nib::ManagedObject
{
public:
    Thing() = default;
    Thing(std::string name, Texts& events) : m_name(std::move(name)), m_events(&events) {}

    void ReleaseGLObject() override
    {
        ++released;
        Note("release ");
    }
    void RestoreGLObject() override
    {
        ++restored;
        Note("restore ");
        if (onRestore)
            onRestore();
    }

    int released = 0;
    int restored = 0;
    std::function<void()> onRestore;

private:
    void Note(const char* what)
    {
        if (m_events)
            m_events->push_back(what + m_name);
    }

    std::string m_name;
    Texts* m_events = nullptr;
};

/// As the library's objects are made: the managed part is not where the object begins.
class Interface
{
public:
    virtual ~Interface() = default;
    virtual int Number() = 0;
};

class SecondBaseThing : public Interface, public Thing
{
public:
    int Number() override { return 7; }
};

TEST(ManagedObject, IsNotSubscribedAtConstruction)
{
    SimDriver driver;
    BoundQueue queue;

    Thing thing;

    EXPECT_FALSE(thing.IsSubscribed());
    queue.observer.DispatchRelease();
    EXPECT_EQ(thing.released, 0);
}

TEST(ManagedObject, RegisterSubscribesToTheQueueOfTheThread)
{
    SimDriver driver;
    BoundQueue queue;
    Thing thing;

    thing.Register();

    EXPECT_TRUE(thing.IsSubscribed());
    queue.observer.DispatchRelease();
    EXPECT_EQ(thing.released, 1);
    queue.observer.DispatchRestore();
    EXPECT_EQ(thing.restored, 1);
    EXPECT_TRUE(driver.Log().empty());
}

TEST(ManagedObject, ASecondRegisterOnlyWritesALine)
{
    SimDriver driver;
    Thing thing;
    {
        BoundQueue queue;
        thing.Register();

        thing.Register();

        EXPECT_TRUE(thing.IsSubscribed());
        EXPECT_EQ(driver.LogTexts(ANDROID_LOG_INFO),
                  (Texts{"void Nib::ManagedObject::Register() Object Already subscribed to obtain "
                         "Release/Restore calls!"}));
        EXPECT_EQ(driver.Log().size(), 1u);
        // In the list once: nobody is left when it is unsubscribed once.
        thing.Unregister();
    }
    EXPECT_EQ(driver.Log().size(), 1u);
}

TEST(ManagedObject, ASecondRegisterOnAnotherQueueKeepsTheFirst)
{
    SimDriver driver;
    Thing thing;
    BoundQueue first;
    thing.Register();
    {
        BoundQueue second;
        thing.Register();
        second.observer.DispatchRelease();
    }

    EXPECT_EQ(thing.released, 0);
    first.observer.DispatchRelease();
    EXPECT_EQ(thing.released, 1);
    Nib::AttachToThread(&first);
}

TEST(ManagedObject, WithoutAQueueItStaysUnmanaged)
{
    SimDriver driver;
    Thing thing;

    thing.Register();

    EXPECT_FALSE(thing.IsSubscribed());
    EXPECT_EQ(driver.LogTexts(ANDROID_LOG_ERROR),
              (Texts{"void Nib::ManagedObject::Register() - GL thread NOT found. This function "
                     "should be called on GL thread"}));
    EXPECT_EQ(driver.Log().size(), 1u);
}

TEST(ManagedObject, OnAQueueThatManagesNothingItStaysUnmanagedInSilence)
{
    SimDriver driver;
    BoundPlainQueue queue;
    Thing thing;

    thing.Register();

    EXPECT_FALSE(thing.IsSubscribed());
    EXPECT_TRUE(driver.Log().empty());
}

TEST(ManagedObject, OnAManagedQueueWithoutAnObserverItStaysUnmanagedInSilence)
{
    SimDriver driver;
    BoundQueue queue;
    queue.GiveNoObserver();
    Thing thing;

    thing.Register();

    EXPECT_FALSE(thing.IsSubscribed());
    EXPECT_TRUE(driver.Log().empty());
}

TEST(ManagedObject, MayRegisterAfterAnAttemptThatFailed)
{
    SimDriver driver;
    Thing thing;
    thing.Register();
    BoundQueue queue;

    thing.Register();

    EXPECT_TRUE(thing.IsSubscribed());
    thing.Unregister();
}

TEST(ManagedObject, UnregisterEndsTheSubscription)
{
    SimDriver driver;
    BoundQueue queue;
    Thing thing;
    thing.Register();

    thing.Unregister();

    EXPECT_FALSE(thing.IsSubscribed());
    queue.observer.DispatchRelease();
    EXPECT_EQ(thing.released, 0);
    EXPECT_TRUE(driver.Log().empty());
}

TEST(ManagedObject, UnregisterWithoutASubscriptionDoesNothing)
{
    SimDriver driver;
    Thing thing;

    thing.Unregister();

    EXPECT_TRUE(driver.Log().empty());
}

TEST(ManagedObject, MayBeRegisteredAgain)
{
    SimDriver driver;
    BoundQueue queue;
    Thing thing;
    thing.Register();
    thing.Unregister();

    thing.Register();

    EXPECT_TRUE(thing.IsSubscribed());
    queue.observer.DispatchRelease();
    EXPECT_EQ(thing.released, 1);
}

TEST(ManagedObject, DestructionEndsTheSubscription)
{
    SimDriver driver;
    {
        BoundQueue queue;
        auto thing = std::make_unique<Thing>();
        thing->Register();

        thing.reset();

        queue.observer.DispatchRelease();
    }
    EXPECT_TRUE(driver.Log().empty());
}

const char* const kForeign =
    "void Nib::ManagedObject::Unregister() Object was subscribed to other MessageQueue.  Probably "
    "object is static! It is not safe to use static GL objects.";

TEST(ManagedObject, DestroyedOnAForeignThreadLeavesItsEntryBehind)
{
    SimDriver driver;
    {
        BoundQueue queue;
        auto thing = std::make_unique<Thing>();
        thing->Register();

        std::thread foreign([&] { thing.reset(); });
        foreign.join();

        EXPECT_EQ(driver.LogTexts(ANDROID_LOG_WARN), (Texts{kForeign}));
        driver.ForgetLog();
    }
    EXPECT_EQ(driver.LogTexts(ANDROID_LOG_WARN),
              (Texts{"~Observer Subscriber list is not empty: 1 objects still subscribed."}));
    EXPECT_EQ(driver.LogTexts(ANDROID_LOG_DEBUG), (Texts{"    0: - N18ManagedObjectTypes5ThingE"}));
}

TEST(ManagedObject, UnregisteredOnAThreadWithoutAQueueForgetsItsObserver)
{
    SimDriver driver;
    BoundQueue queue;
    Thing thing;
    thing.Register();

    std::thread foreign([&] { thing.Unregister(); });
    foreign.join();

    EXPECT_FALSE(thing.IsSubscribed());
    // The entry is still there, and the object still alive.
    queue.observer.DispatchRelease();
    EXPECT_EQ(thing.released, 1);
}

TEST(ManagedObject, UnregisteredOnAnotherQueueLeavesItsEntryBehind)
{
    SimDriver driver;
    BoundQueue first;
    Thing thing;
    thing.Register();
    {
        BoundQueue second;
        thing.Unregister();
    }

    EXPECT_EQ(driver.LogTexts(ANDROID_LOG_WARN), (Texts{kForeign}));
    EXPECT_FALSE(thing.IsSubscribed());
    first.observer.DispatchRelease();
    EXPECT_EQ(thing.released, 1);
}

TEST(ManagedObject, UnregisteredOnAPlainQueueLeavesItsEntryBehind)
{
    SimDriver driver;
    BoundQueue first;
    Thing thing;
    thing.Register();
    {
        BoundPlainQueue second;
        thing.Unregister();
    }

    EXPECT_EQ(driver.LogTexts(ANDROID_LOG_WARN), (Texts{kForeign}));
    EXPECT_FALSE(thing.IsSubscribed());
}

TEST(ManagedObject, UnregisteredWhenItsQueueNoLongerGivesAnObserverLeavesItsEntryBehind)
{
    SimDriver driver;
    BoundQueue queue;
    Thing thing;
    thing.Register();
    queue.GiveNoObserver();

    thing.Unregister();

    EXPECT_EQ(driver.LogTexts(ANDROID_LOG_WARN), (Texts{kForeign}));
    EXPECT_FALSE(thing.IsSubscribed());
}

TEST(ManagedObject, TwoReleasesInARowReleaseOnce)
{
    Thing thing;

    thing.OnRelease();
    thing.OnRelease();

    EXPECT_EQ(thing.released, 1);
}

TEST(ManagedObject, ARestoreOfALiveObjectDoesNothing)
{
    Thing thing;

    thing.OnRestore();

    EXPECT_EQ(thing.restored, 0);
}

TEST(ManagedObject, TwoRestoresInARowRestoreOnce)
{
    Thing thing;
    thing.OnRelease();

    thing.OnRestore();
    thing.OnRestore();

    EXPECT_EQ(thing.restored, 1);
}

TEST(ManagedObject, GoesThroughReleaseAndRestoreAgainAndAgain)
{
    Thing thing;

    for (int i = 0; i < 3; ++i)
    {
        thing.OnRelease();
        thing.OnRestore();
    }

    EXPECT_EQ(thing.released, 3);
    EXPECT_EQ(thing.restored, 3);
}

TEST(ManagedObject, ARestoreThatThrowsLeavesItReleased)
{
    Thing thing;
    thing.OnRelease();
    thing.onRestore = [] { throw std::runtime_error("no memory"); };
    EXPECT_THROW(thing.OnRestore(), std::runtime_error);
    thing.onRestore = nullptr;

    thing.OnRestore();

    EXPECT_EQ(thing.restored, 2);
}

TEST(ManagedObject, AreReleasedBackwardsAndRestoredForwards)
{
    SimDriver driver;
    BoundQueue queue;
    Texts events;
    Thing texture("texture", events);
    Thing target("target", events);
    texture.Register();
    target.Register();

    queue.observer.DispatchRelease();
    queue.observer.DispatchRestore();

    EXPECT_EQ(events,
              (Texts{"release target", "release texture", "restore texture", "restore target"}));
}

TEST(ManagedObject, IsReachedWhereItIsNotTheFirstBase)
{
    SimDriver driver;
    BoundQueue queue;
    SecondBaseThing thing;
    thing.Register();

    queue.observer.DispatchRelease();

    EXPECT_EQ(thing.released, 1);
}

TEST(ManagedObject, MadeDuringARestoreIsSubscribedAndLeftAlone)
{
    SimDriver driver;
    BoundQueue queue;
    std::unique_ptr<Thing> made;
    Thing maker;
    maker.Register();
    maker.onRestore = [&]
    {
        made = std::make_unique<Thing>();
        made->Register();
    };
    queue.observer.DispatchRelease();

    queue.observer.DispatchRestore();

    EXPECT_TRUE(made->IsSubscribed());
    EXPECT_EQ(made->restored, 0);
    EXPECT_EQ(driver.LogTexts(ANDROID_LOG_DEBUG),
              (Texts{"Warning! Subscribe while dispatch, N18ManagedObjectTypes5ThingE"}));
}

TEST(ManagedObject, MayDestroyALaterObjectWhileItIsRestored)
{
    SimDriver driver;
    BoundQueue queue;
    Thing first;
    first.Register();
    auto second = std::make_unique<Thing>();
    second->Register();
    Thing third;
    third.Register();
    first.onRestore = [&] { second.reset(); };
    queue.observer.DispatchRelease();

    queue.observer.DispatchRestore();

    EXPECT_EQ(first.restored, 1);
    EXPECT_EQ(third.restored, 1);
    EXPECT_EQ(driver.LogTexts(ANDROID_LOG_DEBUG),
              (Texts{"Warning! Unsubscribe while dispatch, N18ManagedObjectTypes5ThingE"}));
}

TEST(ManagedObject, CannotUnregisterWhileItIsRestored)
{
    SimDriver driver;
    BoundQueue queue;
    Thing thing;
    thing.Register();
    thing.onRestore = [&] { thing.Unregister(); };
    queue.observer.DispatchRelease();

    EXPECT_THROW(queue.observer.DispatchRestore(), std::logic_error);

    EXPECT_TRUE(thing.IsSubscribed());
    thing.Unregister();
    EXPECT_FALSE(thing.IsSubscribed());
}

TEST(ManagedObjectDeathTest, DestroyedInsideItsOwnRestoreEndsTheProcess)
{
    GTEST_FLAG_SET(death_test_style, "threadsafe");
    const auto destroyItself = []
    {
        SimDriver driver;
        BoundQueue queue;
        auto* thing = new Thing;
        thing->Register();
        thing->onRestore = [thing] { delete thing; };
        queue.observer.DispatchRelease();
        queue.observer.DispatchRestore();
    };

    EXPECT_DEATH(destroyItself(), "Error: list iterator is invalidated");
}

} // namespace ManagedObjectTypes
