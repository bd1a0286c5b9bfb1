#include "RunNib.h"

#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include <string>
#include <vector>

// What is measured, and how it is told. How fast anything is, no test judges.

namespace
{

using Json = nlohmann::json;
using Strings = std::vector<std::string>;

NibResult RunBench(Strings further, const std::string& temporary)
{
    Strings arguments = {"bench", "--seconds", "0.2"};
    arguments.insert(arguments.end(), further.begin(), further.end());
    return RunNib(arguments, {{"DISPLAY", ""}, {"WAYLAND_DISPLAY", ""}, {"TMPDIR", temporary}});
}

Strings Keys(const Json& object)
{
    Strings keys;
    for (const auto& [key, value] : object.items())
        keys.push_back(key);
    return keys;
}

void ExpectTimes(const Json& times)
{
    ASSERT_TRUE(times.is_object()) << times;
    EXPECT_EQ(Keys(times), Strings({"count", "p50", "p99"}));
    EXPECT_GE(times["count"], 1);
    EXPECT_GT(times["p50"], 0.0);
    EXPECT_GE(times["p99"], times["p50"]);
}

} // namespace

TEST(Bench, JsonHasTheDocumentedKeys)
{
    const TemporaryFolder folder;
    const NibResult run = RunBench({"--json"}, folder.Path("."));
    ASSERT_EQ(run.status, 0) << run.err;
    EXPECT_EQ(run.err, "") << "no progress where there is no terminal";

    const Json bench = Json::parse(run.out);
    EXPECT_EQ(Keys(bench), Strings({"gl", "handOver", "processors", "programStart", "replay",
                                    "schema", "seconds"}));
    EXPECT_EQ(bench["schema"], 1);
    EXPECT_EQ(bench["seconds"], 0.2);
    EXPECT_GE(bench["processors"], 1);
    EXPECT_EQ(Keys(bench["gl"]), Strings({"renderer", "version"}));
    EXPECT_NE(bench["gl"]["renderer"], "");
    EXPECT_EQ(Keys(bench["handOver"]),
              Strings({"callMicroseconds", "postNanoseconds", "wakeMicroseconds"}));
    EXPECT_EQ(Keys(bench["programStart"]),
              Strings({"fileMicroseconds", "memoryMicroseconds", "sourceMicroseconds"}));
    EXPECT_EQ(Keys(bench["replay"]), Strings({"frameMilliseconds", "samples", "samplesPerSecond"}));
    for (const char* section : {"handOver", "programStart"})
    {
        for (const auto& [key, times] : bench[section].items())
        {
            SCOPED_TRACE(key);
            ExpectTimes(times);
        }
    }
    ExpectTimes(bench["replay"]["frameMilliseconds"]);
    EXPECT_EQ(bench["replay"]["samples"], bench["replay"]["frameMilliseconds"]["count"]);
    EXPECT_GT(bench["replay"]["samplesPerSecond"], 0.0);
}

TEST(Bench, TableNamesWhatIsMeasured)
{
    const TemporaryFolder folder;
    const NibResult run = RunBench({}, folder.Path("."));
    ASSERT_EQ(run.status, 0) << run.err;
    for (const char* row :
         {"post to a busy worker", "synchronous call", "worker asleep", "compiled and linked",
          "from its file", "from memory", "frame, until it is presented", "samples a second"})
        EXPECT_NE(run.out.find(row), std::string::npos) << row << " in\n" << run.out;
}

TEST(Bench, LeavesNoFileBehind)
{
    const TemporaryFolder folder;
    ASSERT_EQ(RunBench({}, folder.Path(".")).status, 0);
    EXPECT_EQ(folder.Files(), Strings());
}

TEST(Bench, SaysThatEglDoesNotStart)
{
    const NibResult run =
        RunNib({"bench", "--seconds", "0.1"}, {{"DISPLAY", ""}, {"EGL_PLATFORM", "none-such"}});
    EXPECT_EQ(run.status, 2);
    EXPECT_EQ(run.out, "");
    EXPECT_NE(run.err.find("nib: EGL does not start here"), std::string::npos) << run.err;
}

TEST(Bench, SaysWhereNoFolderCanBeMade)
{
    const TemporaryFolder folder;
    const NibResult run = RunBench({}, folder.Path("missing"));
    EXPECT_EQ(run.status, 2);
    EXPECT_EQ(run.err, "nib: no temporary folder can be made; set TMPDIR to where one can\n");
}

TEST(Bench, RefusesALengthBeyondItsBounds)
{
    for (const char* seconds : {"0", "16", "-1", "long"})
    {
        const NibResult run = RunNib({"bench", "--seconds", seconds});
        EXPECT_EQ(run.status, 2) << seconds;
        EXPECT_NE(run.err.find("--seconds"), std::string::npos) << run.err;
    }
}

TEST(Bench, HelpNamesItsOptions)
{
    const NibResult run = RunNib({"bench", "--help"});
    EXPECT_EQ(run.status, 0);
    EXPECT_NE(run.out.find("--seconds"), std::string::npos);
    EXPECT_NE(run.out.find("--json"), std::string::npos);
}
