// The file that `nib draw --trace` writes, as a viewer takes it.

#include "RunNib.h"

#include <fstream>
#include <gtest/gtest.h>
#include <map>
#include <nlohmann/json.hpp>
#include <set>

namespace
{

using Json = nlohmann::json;
using Words = std::vector<std::string>;

class DrawTrace : public testing::Test
{
protected:
    NibResult Draw(Words more)
    {
        more.insert(more.begin(), {"draw", NIB_SAMPLE, "-o", m_folder.Path("page.png")});
        return RunNib(more, {{"DISPLAY", ""}, {"NIB_CACHE_DIR", m_folder.Path("sdk")}});
    }

    Json Traced(Words more)
    {
        const std::string file = m_folder.Path("trace.json");
        more.insert(more.end(), {"--trace", file});
        const NibResult result = Draw(more);
        EXPECT_EQ(result.status, 0) << result.err;
        EXPECT_EQ(result.err, "");
        std::ifstream stream(file);
        return Json::parse(stream);
    }

    TemporaryFolder m_folder;
};

/// The names of the lanes, by thread.
std::map<int, std::string> Lanes(const Json& trace)
{
    std::map<int, std::string> lanes;
    for (const Json& event : trace)
    {
        if (event.at("ph") == "M")
            lanes[event.at("tid")] = event.at("args").at("name");
    }
    return lanes;
}

/// What happens on the lanes of that name, as "name" for each event and "outer/name" for what
/// happens within another.
std::set<std::string> Names(const Json& trace, const std::string& lane)
{
    const std::map<int, std::string> lanes = Lanes(trace);
    std::map<int, Words> open;
    std::set<std::string> names;
    for (const Json& event : trace)
    {
        const int thread = event.at("tid");
        if (event.at("ph") == "M" || event.at("ph") == "C" || lanes.at(thread) != lane)
            continue;
        if (event.at("ph") == "E")
        {
            open[thread].pop_back();
            continue;
        }
        const std::string name = event.at("name");
        names.insert(name);
        if (!open[thread].empty())
            names.insert(open[thread].back() + "/" + name);
        if (event.at("ph") == "B")
            open[thread].push_back(name);
    }
    return names;
}

/// Each lane's ends have their beginnings, and its time does not run backwards.
void ExpectNested(const Json& trace)
{
    std::map<int, int> depths;
    std::map<int, double> times;
    for (const Json& event : trace)
    {
        if (event.at("ph") == "M" || event.at("ph") == "C")
            continue;
        const int thread = event.at("tid");
        depths[thread] += event.at("ph") == "B" ? 1 : event.at("ph") == "E" ? -1 : 0;
        ASSERT_GE(depths[thread], 0) << event;
        ASSERT_GE(event.at("ts"), times[thread]) << event;
        times[thread] = event.at("ts");
    }
    for (const auto& [thread, depth] : depths)
        EXPECT_EQ(depth, 0) << thread;
}

TEST_F(DrawTrace, HasALaneAThreadWithWhatItDoesNested)
{
    const Json trace = Traced({"--speed", "max"});
    ExpectNested(trace);
    std::set<std::string> lanes;
    for (const auto& [thread, name] : Lanes(trace))
        lanes.insert(name);
    EXPECT_EQ(lanes, (std::set<std::string>{"nib", "nib draw"}));

    const std::set<std::string> own = Names(trace, "nib");
    EXPECT_EQ(own.count("present/wait"), 1u);
    const std::set<std::string> drawn = Names(trace, "nib draw");
    for (const char* name : {"create", "compile program", "save program", "begin stroke", "paint",
                             "view", "frame", "idle", "destroy"})
        EXPECT_EQ(drawn.count(name), 1u) << name;
    EXPECT_EQ(drawn.count("Nib::WorkerTask::Member0<Nib::GLES::RenderThreadGLImpl, void "
                          "(Nib::GLES::RenderThreadGLImpl::*)()>/frame"),
              1u);
}

TEST_F(DrawTrace, ShowsTheLossOfTheContextAndWhatComesBack)
{
    const Json trace = Traced({"--lose-context", "every:200"});
    ExpectNested(trace);
    const std::set<std::string> page = Names(trace, "nib page");
    for (const char* name : {"loss/release objects", "loss/destroy", "restore/restore objects",
                             "restore objects/load program"})
        EXPECT_EQ(page.count(name), 1u) << name;
}

TEST_F(DrawTrace, CountsTheTasksThatWait)
{
    std::set<std::string> counters;
    int most = 0;
    int last = -1;
    for (const Json& event : Traced({}))
    {
        if (event.at("ph") != "C")
            continue;
        const std::string name = event.at("name");
        counters.insert(name.substr(0, name.find(" (")));
        last = event.at("args").at("value");
        most = std::max(most, last);
    }
    EXPECT_EQ(counters, (std::set<std::string>{"queue nib draw"}));
    EXPECT_GE(most, 1);
    EXPECT_EQ(last, 0);
}

TEST_F(DrawTrace, AFileThatCannotBeWrittenIsTheUsersError)
{
    const NibResult result = Draw({"--trace", "/nowhere/trace.json"});
    EXPECT_EQ(result.status, 2);
    EXPECT_EQ(result.err, "nib: --trace: cannot write to '/nowhere/trace.json': No such file or "
                          "directory\n");
}

TEST_F(DrawTrace, AFullDiskIsToldWhenAllIsDrawn)
{
    const NibResult result = Draw({"--trace", "/dev/full"});
    EXPECT_EQ(result.status, 2);
    EXPECT_EQ(result.err, "nib: --trace: '/dev/full' could not be written whole\n");
    const std::vector<std::string> files = m_folder.Files();
    EXPECT_EQ(std::count(files.begin(), files.end(), "page.png"), 1);
}

} // namespace
