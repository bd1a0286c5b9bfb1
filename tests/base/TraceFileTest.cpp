// The trace file, as a viewer reads it.

#include "base/ChildProcess.h"
#include "sim/SimDriver.h"

#include <nib/base.h>
#include <nib/trace.h>

#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include <csignal>
#include <cstdlib>
#include <fstream>
#include <sstream>

#include <sys/stat.h>
#include <unistd.h>

using namespace Nib;
using nlohmann::json;

namespace
{

using Texts = std::vector<std::string>;

std::string TextOf(const std::string& path)
{
    std::ifstream file(path);
    std::ostringstream text;
    text << file.rdbuf();
    return text.str();
}

/// The events of a lane in order, without its name.
std::vector<json> Events(const json& trace, std::uint64_t thread)
{
    std::vector<json> events;
    for (const json& event : trace)
    {
        if (event.at("tid") == thread && event.at("ph") != "M")
            events.push_back(event);
    }
    return events;
}

json LaneName(const json& trace, std::uint64_t thread)
{
    json name;
    for (const json& event : trace)
    {
        if (event.at("tid") == thread && event.at("ph") == "M" && event.at("name") == "thread_name")
            name = event.at("args").at("name");
    }
    return name;
}

class TraceFile : public testing::Test
{
protected:
    ~TraceFile() override { Trace::Stop(); }

    json Read() const { return json::parse(TextOf(m_path)); }

    const TemporaryFolder m_folder;
    const std::string m_path = m_folder / "trace.json";
    const std::uint64_t m_thread = GetNibCurrentThreadId();
};

TEST_F(TraceFile, IsAnArrayOfEventsWithTheNameOfTheLane)
{
    ASSERT_TRUE(Trace::StartFile(m_path.c_str()));
    {
        const TraceLane lane("pen");
        const TraceScope scope("work", "stroke", {{"points", 12}, {"brush", "marker"}});
        Trace::Instant("work", "lifted");
        Trace::Counter("work", "points", -7);
    }
    EXPECT_TRUE(Trace::Stop());

    const json trace = Read();
    EXPECT_EQ(LaneName(trace, m_thread), "pen");
    const std::vector<json> events = Events(trace, m_thread);
    ASSERT_EQ(events.size(), 4u);
    for (const json& event : events)
    {
        EXPECT_EQ(event.at("pid"), getpid());
        EXPECT_GT(event.at("ts"), 0.0);
    }
    EXPECT_EQ(events[0].at("ph"), "B");
    EXPECT_EQ(events[0].at("cat"), "work");
    EXPECT_EQ(events[0].at("name"), "stroke");
    EXPECT_EQ(events[0].at("args"), json({{"points", 12}, {"brush", "marker"}}));
    EXPECT_EQ(events[1].at("ph"), "i");
    EXPECT_EQ(events[1].at("s"), "t");
    EXPECT_EQ(events[1].at("name"), "lifted");
    EXPECT_EQ(events[2].at("ph"), "C");
    EXPECT_EQ(events[2].at("name"), "points pen (" + std::to_string(m_thread) + ")");
    EXPECT_EQ(events[2].at("args"), json({{"value", -7}}));
    EXPECT_EQ(events[3].at("ph"), "E");
    EXPECT_GE(events[3].at("ts"), events[0].at("ts"));
}

TEST_F(TraceFile, ALaneWithoutANameHasThatOfItsThread)
{
    pthread_setname_np(pthread_self(), "painter");
    Trace::StartFile(m_path.c_str());
    Trace::Instant("work", "one");
    Trace::Stop();
    EXPECT_EQ(LaneName(Read(), m_thread), "painter");
}

TEST_F(TraceFile, WhatIsOpenAtItsEndEndsThere)
{
    Trace::StartFile(m_path.c_str());
    Trace::Begin("work", "outer");
    Trace::Begin("work", "inner");
    Trace::Stop();
    const std::vector<json> events = Events(Read(), m_thread);
    ASSERT_EQ(events.size(), 4u);
    EXPECT_EQ(events[2].at("ph"), "E");
    EXPECT_EQ(events[3].at("ph"), "E");
}

TEST_F(TraceFile, TextsOfAnyBytesLeaveItReadable)
{
    Trace::StartFile(m_path.c_str());
    Trace::Instant("work", "\"quoted\\\"\n\x01", {{"\xC3\xA4\xF0\x9F\x96\x8A", "\xC3\x28"}});
    Trace::Instant("work", "\xED\xA0\x80|\xC0\x80|\xF5\x80\x80\x80|\xE2\x82", {});
    Trace::Stop();
    const std::vector<json> events = Events(Read(), m_thread);
    ASSERT_EQ(events.size(), 2u);
    EXPECT_EQ(events[0].at("name"), "\"quoted\\\"\n\x01");
    EXPECT_EQ(events[0].at("args"), json({{"\xC3\xA4\xF0\x9F\x96\x8A", "?("}}));
    EXPECT_EQ(events[1].at("name"), "\?\?\?|\?\?|\?\?\?\?|\?\?");
}

TEST_F(TraceFile, AnotherFileTakesItsPlaceAndTheFirstIsWhole)
{
    Trace::StartFile(m_path.c_str());
    Trace::Instant("work", "one");
    const std::string second = m_folder / "second.json";
    Trace::StartFile(second.c_str());
    Trace::Instant("work", "two");
    EXPECT_EQ(Events(Read(), m_thread).at(0).at("name"), "one");
    Trace::Stop();
    EXPECT_EQ(Events(json::parse(TextOf(second)), m_thread).at(0).at("name"), "two");
}

TEST_F(TraceFile, MayBeStartedAgainUnderItsOwnName)
{
    Trace::StartFile(m_path.c_str());
    Trace::Instant("work", "one");
    Trace::StartFile(m_path.c_str());
    Trace::Instant("work", "two");
    Trace::Stop();
    const std::vector<json> events = Events(Read(), m_thread);
    ASSERT_EQ(events.size(), 1u);
    EXPECT_EQ(events[0].at("name"), "two");
}

// ---- ends that nobody planned -------------------------------------------------------------------

TEST_F(TraceFile, LacksOnlyItsBracketWhenTheProcessIsKilled)
{
    const ChildResult result = RunInChild(
        [&]
        {
            Trace::StartFile(m_path.c_str());
            for (int number = 0; number < 2000; ++number)
                const TraceScope scope("work", "turn");
            std::raise(SIGKILL);
        });
    EXPECT_EQ(result.signal, SIGKILL);
    const json trace = json::parse(TextOf(m_path) + "]");
    EXPECT_GT(trace.size(), 1000u); // but for the last of them, which were not written yet
    EXPECT_EQ(trace.at(1).at("name"), "turn");
}

TEST_F(TraceFile, IsWholeWhenTheProcessEndsWithoutStoppingIt)
{
    const ChildResult result = RunInChild(
        [&]
        {
            Trace::StartFile(m_path.c_str());
            Trace::Instant("work", "one");
            std::exit(0); // an ordinary end, with the ends of static objects
        });
    EXPECT_EQ(result.exitCode, 0);
    EXPECT_EQ(Read().size(), 2u);
}

TEST_F(TraceFile, IsNotBegunWhereItCannotBeOpened)
{
    const SimDriver driver;
    EXPECT_FALSE(Trace::StartFile("/nowhere/trace.json"));
    EXPECT_FALSE(Trace::IsOn());
    EXPECT_EQ(driver.LogTexts(ANDROID_LOG_WARN),
              Texts({"Trace: cannot write to '/nowhere/trace.json': No such file or directory. "
                     "Nothing is traced."}));
}

TEST_F(TraceFile, IsNoPipe)
{
    const SimDriver driver;
    ASSERT_EQ(mkfifo(m_path.c_str(), 0600), 0);
    EXPECT_FALSE(Trace::StartFile(m_path.c_str()));
    EXPECT_EQ(driver.LogTexts(ANDROID_LOG_WARN),
              Texts({"Trace: cannot write to '" + m_path + "': it is a pipe. Nothing is traced."}));
}

TEST_F(TraceFile, AFullDiskIsOneLineInTheLog)
{
    const SimDriver driver;
    ASSERT_TRUE(Trace::StartFile("/dev/full"));
    for (int number = 0; number < 2000; ++number)
        Trace::Instant("work", "turn");
    EXPECT_FALSE(Trace::Stop());
    EXPECT_EQ(driver.LogTexts(ANDROID_LOG_WARN),
              Texts({"Trace: cannot write to '/dev/full': No space left on device. It ends there; "
                     "drawing goes on."}));
}

// ---- the environment ----------------------------------------------------------------------------

TEST_F(TraceFile, IsStartedByTheEnvironment)
{
    const Variable variable("NIB_TRACE", m_path.c_str());
    Trace::StartFromEnvironment();
    Trace::Instant("work", "one");
    Trace::Stop();
    EXPECT_EQ(Events(Read(), m_thread).at(0).at("name"), "one");
}

TEST_F(TraceFile, TheEnvironmentIsReadOnce)
{
    Trace::StartFromEnvironment();
    const Variable variable("NIB_TRACE", m_path.c_str());
    Trace::StartFromEnvironment();
    EXPECT_FALSE(Trace::IsOn());
}

TEST_F(TraceFile, TheApplicationGoesBeforeTheEnvironment)
{
    const Variable variable("NIB_TRACE", m_path.c_str());
    Trace::Stop();
    Trace::StartFromEnvironment();
    EXPECT_FALSE(Trace::IsOn());
}

} // namespace
