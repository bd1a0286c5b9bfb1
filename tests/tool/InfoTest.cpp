#include "RunNib.h"

#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include <map>
#include <set>
#include <string>
#include <vector>

namespace
{

using Json = nlohmann::json;
using Environment = std::map<std::string, std::string>;

const Environment kNoDisplay = {{"DISPLAY", ""}, {"WAYLAND_DISPLAY", ""}, {"EGL_PLATFORM", ""}};
const Environment kNoDriver = {{"DISPLAY", ""}, {"EGL_PLATFORM", "none-such"}};

Json ReadInfo(const Environment& environment)
{
    const NibResult run = RunNib({"info", "--json"}, environment);
    EXPECT_EQ(run.status, 0) << run.err;
    return Json::parse(run.out);
}

std::vector<std::string> Keys(const Json& object)
{
    std::vector<std::string> keys;
    for (const auto& [key, value] : object.items())
        keys.push_back(key);
    return keys;
}

TEST(Info, SectionsAreTheDocumentedOnes)
{
    const std::vector<std::string> sections = {"compatible",      "configurations",
                                               "contextPriority", "egl",
                                               "frontBuffer",     "gl",
                                               "gpuLists",        "nib",
                                               "programCache",    "schema",
                                               "settings",        "timing",
                                               "updateMode"};
    EXPECT_EQ(Keys(ReadInfo(kNoDisplay)), sections);
    EXPECT_EQ(Keys(ReadInfo(kNoDriver)), sections) << "the same where EGL does not start";
}

TEST(Info, NamesTheVersions)
{
    const Json info = ReadInfo(kNoDisplay);
    EXPECT_EQ(info["schema"], 1);
    EXPECT_EQ(info["nib"]["library"], "1.0.0");
    EXPECT_EQ(info["nib"]["headers"], "1.0.0");
}

TEST(Info, ExactlyOneConfigurationIsChosen)
{
    const Json configurations = ReadInfo(kNoDisplay)["configurations"];
    std::vector<Json> chosen;
    for (const Json& config : configurations["all"])
    {
        if (config["ordinary"] == "chosen")
            chosen.push_back(config);
    }
    ASSERT_EQ(chosen.size(), 1u);
    EXPECT_EQ(chosen[0]["id"], configurations["ordinary"]["id"]);
    for (const char* size : {"red", "green", "blue", "alpha"})
        EXPECT_EQ(chosen[0][size], 8) << size;
}

TEST(Info, EachRejectedConfigurationHasItsReason)
{
    const std::set<std::string> reasons = {
        "chosen",
        "not for OpenGL ES 3",
        "not for surfaces of type window",
        "not for surfaces of type pbuffer",
        "fewer colour bits than asked for",
        "not exactly 8 bits for each of red, green, blue and alpha",
        "more depth and stencil bits than the chosen one",
        "behind the chosen one in EGL's order",
    };
    const Json configurations = ReadInfo(kNoDisplay)["configurations"];
    const int chosenBits = configurations["ordinary"]["depth"].get<int>() +
                           configurations["ordinary"]["stencil"].get<int>();
    ASSERT_GT(configurations["all"].size(), 1u);
    for (const Json& config : configurations["all"])
    {
        const std::string verdict = config["ordinary"];
        EXPECT_EQ(reasons.count(verdict), 1u) << verdict;
        const bool is8888 = config["red"] == 8 && config["green"] == 8 && config["blue"] == 8 &&
                            config["alpha"] == 8;
        if (verdict == "more depth and stencil bits than the chosen one")
        {
            EXPECT_GT(config["depth"].get<int>() + config["stencil"].get<int>(), chosenBits);
        }
        if (verdict == "not exactly 8 bits for each of red, green, blue and alpha")
        {
            EXPECT_FALSE(is8888);
        }
    }
}

TEST(Info, UpdateModeComesWithTheLinesThatLedToIt)
{
    const Json mode = ReadInfo(kNoDisplay)["updateMode"];
    const std::set<std::string> modes = {"0x81", "0x45", "0x07", "0x25", "0x09", "0x01"};
    EXPECT_EQ(modes.count(mode["mode"].get<std::string>()), 1u) << mode["mode"];
    bool told = false;
    for (const std::string reason : mode["reasons"])
        told = told || reason.find("UpdateRectangle::SetUpdateMode()") != std::string::npos;
    EXPECT_TRUE(told) << mode["reasons"];
}

TEST(Info, FrontBufferVerdictGoesStepByStep)
{
    const Json front = ReadInfo(kNoDisplay)["frontBuffer"];
    const std::vector<std::string> expected = {
        "EGL_KHR_mutable_render_buffer",         "KHR_fence_sync",
        "ANDROID_get_frame_timestamps",          "ANDROID_presentation_time",
        "a GPU that is not known to fail at it", "a configuration with a mutable render buffer",
    };
    ASSERT_EQ(front["steps"].size(), expected.size());
    bool all = true;
    for (std::size_t i = 0; i < expected.size(); ++i)
    {
        EXPECT_EQ(front["steps"][i]["step"], expected[i]);
        all = all && front["steps"][i]["passed"].get<bool>();
    }
    EXPECT_EQ(front["supported"], all);
}

TEST(Info, SaysPlainlyThatEglDoesNotStart)
{
    const Json info = ReadInfo(kNoDriver);
    EXPECT_EQ(info["egl"]["started"], false);
    EXPECT_EQ(info["egl"]["missing"].get<std::string>().find("EGL does not start: eglInit"), 0u);
    EXPECT_EQ(info["gl"]["missing"], "EGL has no configuration to draw with");
    EXPECT_TRUE(info["compatible"].is_null());
}

TEST(Info, CountsTheCachesFiles)
{
    Environment environment = kNoDisplay;
    environment["NIB_CACHE_DIR"] = testing::TempDir() + "nib-info-none/sdk";
    const Json cache = ReadInfo(environment)["programCache"];
    EXPECT_EQ(cache["folder"], testing::TempDir() + "nib-info-none/RendererCache");
    EXPECT_EQ(cache["files"], 0);
    EXPECT_EQ(cache["bytes"], 0);
}

TEST(Info, TextForPeopleHasNoColoursWhenPiped)
{
    const NibResult run = RunNib({"info"}, kNoDisplay);
    EXPECT_EQ(run.status, 0);
    EXPECT_EQ(run.err, "");
    EXPECT_EQ(run.out.find('\033'), std::string::npos);
    for (const char* line : {"\negl\n", "\nconfigurations\n", "\nupdate mode\n", "  renderer  "})
        EXPECT_NE(run.out.find(line), std::string::npos) << line;
}

} // namespace
