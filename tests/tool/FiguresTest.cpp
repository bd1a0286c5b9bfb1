#include "Figures.h"

#include <fstream>
#include <gtest/gtest.h>
#include <nlohmann/json.hpp>
#include <numeric>
#include <regex>
#include <set>
#include <string>

namespace
{

using Json = nlohmann::json;

/// Four hundred frames, the slower ones first: 400 ms, 399 ms, ... 1 ms.
Figures WithFrames()
{
    Figures figures;
    figures.strokes = 3;
    figures.samples = 400;
    figures.frames = 400;
    figures.tasks = 1601;
    figures.seconds = 1.5;
    figures.frameTimes.resize(400);
    std::iota(figures.frameTimes.rbegin(), figures.frameTimes.rend(), 1.0f);
    figures.redrawn = 0.0123;
    figures.programs = {2, 5};
    return figures;
}

Figures WithoutFrames()
{
    Figures figures;
    figures.strokes = 1;
    figures.samples = 2;
    figures.tasks = 4;
    figures.programs = {1, 0};
    return figures;
}

TEST(Figures, OneLineForPeople)
{
    EXPECT_EQ(Summary(WithFrames()),
              "3 strokes, 400 samples, 400 frames, 1601 tasks, 1.23 % of the pixels redrawn, "
              "frame time p50 200.00 p95 380.00 p99 396.00 ms, programs 2 compiled 5 loaded");
}

TEST(Figures, LineWithoutFramesLeavesThemOut)
{
    EXPECT_EQ(Summary(WithoutFrames()),
              "1 strokes, 2 samples, 0 frames, 4 tasks, programs 1 compiled 0 loaded");
}

TEST(Figures, JsonHoldsThemAll)
{
    EXPECT_EQ(Json::parse(ToJson(WithFrames())), Json::parse(R"({
        "schema": 1, "strokes": 3, "samples": 400, "frames": 400, "tasks": 1601, "seconds": 1.5,
        "redrawnShare": 0.0123, "frameMilliseconds": {"p50": 200.0, "p95": 380.0, "p99": 396.0},
        "programs": {"compiled": 2, "loaded": 5}})"));
}

TEST(Figures, JsonWithoutFramesHasNull)
{
    const Json figures = Json::parse(ToJson(WithoutFrames()));
    EXPECT_TRUE(figures.at("redrawnShare").is_null());
    EXPECT_TRUE(figures.at("frameMilliseconds").is_null());
    EXPECT_EQ(figures.at("frames"), 0);
}

TEST(Figures, JsonIsOneLineOfShortNumbers)
{
    Figures figures = WithFrames();
    figures.frameTimes.assign(1, 0.1f); // not a round number of doubles
    figures.redrawn = 1.0 / 3.0;
    const std::string text = ToJson(figures);
    EXPECT_EQ(text.find('\n'), std::string::npos);
    EXPECT_NE(text.find("\"p50\":0.1,"), std::string::npos) << text;
    EXPECT_NE(text.find("\"redrawnShare\":0.333333,"), std::string::npos) << text;
}

/// The keys of an object and of those in it.
void AddKeys(const Json& object, std::set<std::string>& keys)
{
    for (const auto& [key, value] : object.items())
    {
        keys.insert(key);
        if (value.is_object())
            AddKeys(value, keys);
    }
}

/// What stands in `code` in the first two columns of the tables of a page.
std::set<std::string> DocumentedKeys(const char* page)
{
    std::ifstream text(page);
    EXPECT_TRUE(text) << page;
    std::set<std::string> keys;
    const std::regex columns("\\|([^|]*)\\|([^|]*)\\|.*"), key("`([^`]+)`");
    for (std::string line; std::getline(text, line);)
    {
        std::smatch row;
        if (!std::regex_match(line, row, columns))
            continue;
        const std::string names = row[1].str() + row[2].str();
        for (std::sregex_iterator name(names.begin(), names.end(), key), end; name != end; ++name)
            keys.insert((*name)[1]);
    }
    return keys;
}

TEST(Figures, EveryKeyIsDocumented)
{
    std::set<std::string> keys;
    AddKeys(Json::parse(ToJson(WithFrames())), keys);
    EXPECT_EQ(DocumentedKeys(NIB_DRAW_JSON_PAGE), keys);
}

} // namespace
