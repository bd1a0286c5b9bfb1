#include "sim/SimDriver.h"

#include <nib/managed_object.h>

#include <gtest/gtest.h>

#include <functional>
#include <memory>
#include <stdexcept>
#include <string>
#include <thread>
#include <vector>

// Not in an unnamed namespace, so that type names are the same under every compiler.
namespace ObserverTypes
{

using Observer = Nib::Observer<Nib::IManagedObject>;
using Events = std::vector<std::string>;

/// Notes what it is told, and does what the test wants on the way.
class Probe : public Nib::IManagedObject
{
public:
    Probe(std::string name, Events& events) : m_name(std::move(name)), m_events(events) {}

    void OnRelease() override
    {
        m_events.push_back("release " + m_name);
        if (onRelease)
            onRelease();
    }
    void OnRestore() override
    {
        m_events.push_back("restore " + m_name);
        if (onRestore)
            onRestore();
    }
    void ReleaseGLObject() override { ADD_FAILURE() << "that is the object's own business"; }
    void RestoreGLObject() override { ADD_FAILURE() << "that is the object's own business"; }

    std::function<void()> onRelease;
    std::function<void()> onRestore;

private:
    std::string m_name;
    Events& m_events;
};

class OtherProbe : public Probe
{
public:
    using Probe::Probe;
};

struct Observed : ::testing::Test
{
    /// A subscriber at the end of the list.
    Probe& Add(const std::string& name)
    {
        probes.push_back(std::make_unique<Probe>(name, events));
        positions.push_back(observer->Subscribe(probes.back().get()));
        return *probes.back();
    }
    void RemoveAll()
    {
        for (const Observer::Position position : positions)
            observer->Unsubscribe(position);
        positions.clear();
    }
    std::vector<std::string> Debug() const { return driver.LogTexts(ANDROID_LOG_DEBUG); }

    SimDriver driver;
    Events events;
    std::vector<std::unique_ptr<Probe>> probes;
    std::vector<Observer::Position> positions;
    std::unique_ptr<Observer> observer = std::make_unique<Observer>();
};

using ObserverTest = Observed;

TEST_F(ObserverTest, ReleasesTheLastSubscriberFirst)
{
    Add("a");
    Add("b");
    Add("c");

    observer->DispatchRelease();

    EXPECT_EQ(events, (Events{"release c", "release b", "release a"}));
    RemoveAll();
}

TEST_F(ObserverTest, RestoresTheFirstSubscriberFirst)
{
    Add("a");
    Add("b");
    Add("c");

    observer->DispatchRestore();

    EXPECT_EQ(events, (Events{"restore a", "restore b", "restore c"}));
    RemoveAll();
}

TEST_F(ObserverTest, DispatchesToNobodyInSilence)
{
    observer->DispatchRelease();
    observer->DispatchRestore();
    observer.reset();

    EXPECT_TRUE(events.empty());
    EXPECT_TRUE(driver.Log().empty());
}

TEST_F(ObserverTest, LeavesOutWhoUnsubscribed)
{
    Add("a");
    Add("b");
    Add("c");
    observer->Unsubscribe(positions[1]);
    positions.erase(positions.begin() + 1);

    observer->DispatchRestore();

    EXPECT_EQ(events, (Events{"restore a", "restore c"}));
    RemoveAll();
}

TEST_F(ObserverTest, SubscribeAnswersThePositionOfTheObject)
{
    Probe& a = Add("a");
    Probe& b = Add("b");

    EXPECT_EQ(*positions[0], &a);
    EXPECT_EQ(*positions[1], &b);
    RemoveAll();
}

TEST_F(ObserverTest, ASubscriberMayStandInTheListTwice)
{
    Probe& a = Add("a");
    positions.push_back(observer->Subscribe(&a));

    observer->DispatchRelease();

    EXPECT_EQ(events, (Events{"release a", "release a"}));
    RemoveAll();
}

TEST_F(ObserverTest, SubscribingAndUnsubscribingOutsideADispatchWritesNothing)
{
    Add("a");
    positions.push_back(observer->Subscribe(nullptr));
    RemoveAll();

    EXPECT_TRUE(driver.Log().empty());
}

TEST_F(ObserverTest, DispatchSkipsNullSubscribers)
{
    Add("a");
    positions.push_back(observer->Subscribe(nullptr));
    Add("b");

    observer->DispatchRelease();
    observer->DispatchRestore();

    EXPECT_EQ(events, (Events{"release b", "release a", "restore a", "restore b"}));
    RemoveAll();
}

TEST_F(ObserverTest, WhoSubscribesDuringARestoreIsReachedByIt)
{
    Add("a").onRestore = [this] { Add("late"); };

    observer->DispatchRestore();

    EXPECT_EQ(events, (Events{"restore a", "restore late"}));
    EXPECT_EQ(Debug(), (Events{"Warning! Subscribe while dispatch, N13ObserverTypes5ProbeE"}));
    RemoveAll();
}

TEST_F(ObserverTest, WhoSubscribesDuringAReleaseIsNotReachedByIt)
{
    Add("a");
    Add("b").onRelease = [this] { Add("late"); };

    observer->DispatchRelease();

    EXPECT_EQ(events, (Events{"release b", "release a"}));
    EXPECT_EQ(Debug(), (Events{"Warning! Subscribe while dispatch, N13ObserverTypes5ProbeE"}));
    RemoveAll();
}

TEST_F(ObserverTest, NamesTheTypeOfTheObjectThatSubscribesWhileDispatching)
{
    OtherProbe other("other", events);
    Add("a").onRelease = [&] { positions.push_back(observer->Subscribe(&other)); };

    observer->DispatchRelease();

    EXPECT_EQ(Debug(),
              (Events{"Warning! Subscribe while dispatch, N13ObserverTypes10OtherProbeE"}));
    RemoveAll();
}

TEST_F(ObserverTest, ANullThatSubscribesWhileDispatchingHasNoTypeName)
{
    Add("a").onRelease = [&] { positions.push_back(observer->Subscribe(nullptr)); };

    observer->DispatchRelease();

    EXPECT_EQ(Debug(), (Events{"Warning! Subscribe while dispatch"}));
    RemoveAll();
}

TEST_F(ObserverTest, ALaterSubscriberMayBeRemovedDuringARestore)
{
    Add("a").onRestore = [this] { observer->Unsubscribe(positions[1]); };
    Add("b");
    Add("c");

    observer->DispatchRestore();

    EXPECT_EQ(events, (Events{"restore a", "restore c"}));
    EXPECT_EQ(Debug(), (Events{"Warning! Unsubscribe while dispatch, N13ObserverTypes5ProbeE"}));
    positions.erase(positions.begin() + 1);
    RemoveAll();
}

TEST_F(ObserverTest, AnEarlierSubscriberMayBeRemovedDuringARestore)
{
    Add("a");
    Add("b").onRestore = [this] { observer->Unsubscribe(positions[0]); };
    Add("c");

    observer->DispatchRestore();
    positions.erase(positions.begin());
    observer->DispatchRelease();

    EXPECT_EQ(events, (Events{"restore a", "restore b", "restore c", "release c", "release b"}));
    RemoveAll();
}

TEST_F(ObserverTest, TheNextToBeReleasedMayBeRemovedDuringARelease)
{
    Add("a");
    Add("b");
    Add("c").onRelease = [this] { observer->Unsubscribe(positions[1]); };

    observer->DispatchRelease();

    EXPECT_EQ(events, (Events{"release c", "release a"}));
    EXPECT_EQ(Debug(), (Events{"Warning! Unsubscribe while dispatch, N13ObserverTypes5ProbeE"}));
    positions.erase(positions.begin() + 1);
    RemoveAll();
}

TEST_F(ObserverTest, TheFirstOfTheListMayBeRemovedDuringARelease)
{
    Add("a");
    Add("b").onRelease = [this] { observer->Unsubscribe(positions[0]); };

    observer->DispatchRelease();

    EXPECT_EQ(events, (Events{"release b"}));
    positions.erase(positions.begin());
    RemoveAll();
}

TEST_F(ObserverTest, ANullRemovedWhileDispatchingHasNoTypeName)
{
    Add("a").onRestore = [this] { observer->Unsubscribe(positions[1]); };
    positions.push_back(observer->Subscribe(nullptr));

    observer->DispatchRestore();

    EXPECT_EQ(Debug(), (Events{"Warning! Unsubscribe while dispatch"}));
    positions.pop_back();
    RemoveAll();
}

TEST_F(ObserverTest, TheSubscriberBeingCalledCannotBeRemoved)
{
    std::string text;
    Add("a").onRestore = [&]
    {
        try
        {
            observer->Unsubscribe(positions[0]);
        }
        catch (const std::logic_error& error)
        {
            text = error.what();
        }
    };
    Add("b");

    observer->DispatchRestore();
    observer->DispatchRelease();

    EXPECT_EQ(text, "Error: list iterator is invalidated");
    EXPECT_EQ(Debug(), (Events{"Warning! Unsubscribe while dispatch, N13ObserverTypes5ProbeE"}));
    EXPECT_EQ(events, (Events{"restore a", "restore b", "release b", "release a"}));
    RemoveAll();
}

TEST_F(ObserverTest, TheLastSubscriberCannotBeRemovedWhileItIsBeingReleased)
{
    Add("a");
    Add("b").onRelease = [this]
    { EXPECT_THROW(observer->Unsubscribe(positions[1]), std::logic_error); };

    observer->DispatchRelease();

    EXPECT_EQ(events, (Events{"release b", "release a"}));
    RemoveAll();
}

TEST_F(ObserverTest, AnExceptionOfASubscriberLeavesTheDispatchAndEndsIt)
{
    Add("a");
    Add("b").onRelease = [] { throw std::runtime_error("from b"); };
    Add("c");

    EXPECT_THROW(observer->DispatchRelease(), std::runtime_error);

    EXPECT_EQ(events, (Events{"release c", "release b"}));
    // No dispatch runs any more: whoever was being called can be removed, without a warning.
    EXPECT_NO_THROW(RemoveAll());
    EXPECT_TRUE(driver.Log().empty());
}

TEST_F(ObserverTest, AnExceptionDuringARestoreEndsTheDispatchToo)
{
    Add("a").onRestore = [] { throw std::runtime_error("from a"); };
    Add("b");

    EXPECT_THROW(observer->DispatchRestore(), std::runtime_error);

    EXPECT_EQ(events, (Events{"restore a"}));
    EXPECT_NO_THROW(RemoveAll());
    EXPECT_TRUE(driver.Log().empty());
}

TEST_F(ObserverTest, ARestoreThatHandsExceptionsOverGoesOn)
{
    Add("a").onRestore = [] { throw std::runtime_error("from a"); };
    Add("b");
    Add("c").onRestore = [] { throw std::runtime_error("from c"); };
    Events failures;

    observer->DispatchRestore([&](const std::exception& failure)
                              { failures.emplace_back(failure.what()); });

    EXPECT_EQ(events, (Events{"restore a", "restore b", "restore c"}));
    EXPECT_EQ(failures, (Events{"from a", "from c"}));
    EXPECT_NO_THROW(RemoveAll());
    EXPECT_TRUE(driver.Log().empty());
}

TEST_F(ObserverTest, AnExceptionFreesTheLock)
{
    Add("a").onRelease = [] { throw std::runtime_error("from a"); };
    EXPECT_THROW(observer->DispatchRelease(), std::runtime_error);

    bool subscribed = false;
    std::thread other(
        [&]
        {
            Probe probe("other thread's", events);
            observer->Unsubscribe(observer->Subscribe(&probe));
            subscribed = true;
        });
    other.join();

    EXPECT_TRUE(subscribed);
    RemoveAll();
}

TEST_F(ObserverTest, TheRefusedRemovalFreesTheLock)
{
    Add("a").onRelease = [this]
    { EXPECT_THROW(observer->Unsubscribe(positions[0]), std::logic_error); };
    observer->DispatchRelease();

    bool dispatched = false;
    std::thread other(
        [&]
        {
            observer->DispatchRestore();
            dispatched = true;
        });
    other.join();

    EXPECT_TRUE(dispatched);
    RemoveAll();
}

TEST_F(ObserverTest, KeepsOtherThreadsOutWhileItDispatches)
{
    // Given a thread that subscribes once the dispatch is under way,
    std::thread other;
    Add("a");
    Add("b").onRelease = [&]
    { other = std::thread([this] { observer->Unsubscribe(observer->Subscribe(nullptr)); }); };

    // when the dispatch goes on to its end,
    observer->DispatchRelease();
    other.join();

    // then the thread was let in afterwards: inside, its calls would have been warned of.
    EXPECT_TRUE(driver.Log().empty());
    RemoveAll();
}

TEST_F(ObserverTest, DestructionReportsWhoIsLeftByTypeAndIndex)
{
    OtherProbe other("other", events);
    Add("a");
    observer->Subscribe(&other);
    observer->Subscribe(nullptr);
    Add("b");

    observer.reset();

    EXPECT_EQ(driver.LogTexts(ANDROID_LOG_WARN),
              (Events{"~Observer Subscriber list is not empty: 4 objects still subscribed."}));
    EXPECT_EQ(Debug(),
              (Events{"    0: - N13ObserverTypes5ProbeE", "    1: - N13ObserverTypes10OtherProbeE",
                      "std::bad_typeid exception thrown", "    3: - N13ObserverTypes5ProbeE"}));
    EXPECT_EQ(driver.Log().front().priority, ANDROID_LOG_WARN);
    EXPECT_EQ(driver.Log().front().tag, "nib_log");
    EXPECT_TRUE(events.empty());
}

TEST_F(ObserverTest, DestructionNamesObjectsThatAreDeadAlready)
{
    Add("a");
    probes.clear();

    observer.reset();

    EXPECT_EQ(Debug(), (Events{"    0: - N13ObserverTypes5ProbeE"}));
}

TEST_F(ObserverTest, DestructionAfterEverybodyLeftWritesNothing)
{
    Add("a");
    RemoveAll();

    observer.reset();

    EXPECT_TRUE(driver.Log().empty());
}

TEST_F(ObserverTest, IsReachedThroughItsInterface)
{
    Nib::ObserverInterface<Nib::IManagedObject>& interface = *observer;
    Probe probe("p", events);

    const auto position = interface.Subscribe(&probe);
    observer->DispatchRelease();
    interface.Unsubscribe(position);
    observer->DispatchRestore();

    EXPECT_EQ(events, (Events{"release p"}));
}

} // namespace ObserverTypes
