#include "OutputOf.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <filesystem>
#include <iterator>
#include <set>
#include <sstream>
#include <string>
#include <vector>

#include <unistd.h>

// How the libraries are linked: what is looked up by name when they are loaded, what is not, and how
// large they are.

namespace
{

/// Mangled names.
using Names = std::set<std::string>;

std::vector<std::string> WordsOf(const std::string& line)
{
    std::istringstream words(line);
    return {std::istream_iterator<std::string>(words), {}};
}

/// What @p file defines for others, of the kinds that `nm` gives letters of @p kinds.
Names Defined(const char* file, const std::string& kinds)
{
    Names names;
    for (const std::string& line :
         OutputOf(std::string(NIB_NM) + " -D --defined-only '" + file + "'"))
    {
        const std::vector<std::string> words = WordsOf(line);
        if (words.size() == 3 && kinds.find(words[1]) != std::string::npos)
            names.insert(words[2]);
    }
    return names;
}

/// What the loader looks up for @p file.
Names LookedUp(const char* file)
{
    Names names;
    for (const std::string& line : OutputOf(std::string(NIB_READELF) + " -rW '" + file + "'"))
    {
        // Offset, info, type, value, name.
        const std::vector<std::string> words = WordsOf(line);
        if (words.size() >= 5 && words[2].rfind("R_", 0) == 0)
            names.insert(words[4].substr(0, words[4].find('@')));
    }
    return names;
}

Names Both(const Names& a, const Names& b)
{
    Names both;
    std::set_intersection(a.begin(), a.end(), b.begin(), b.end(), std::inserter(both, both.end()));
    return both;
}

/// The bytes of @p file without what only debuggers read.
std::uintmax_t StrippedSize(const char* file)
{
    const std::string stripped =
        (std::filesystem::temp_directory_path() / "nib-stripped-").string() +
        std::to_string(getpid());
    OutputOf(std::string(NIB_STRIP) + " -o '" + stripped + "' '" + file + "'");
    const std::uintmax_t size = std::filesystem::file_size(stripped);
    std::filesystem::remove(stripped);
    return size;
}

class LinkedLibrary : public testing::Test
{
protected:
    void SetUp() override
    {
        if (NIB_EXPORTS_ALL)
            GTEST_SKIP()
                << "libraries for sanitizers or coverage are linked as those tools need them";
    }
};

} // namespace

TEST_F(LinkedLibrary, LooksUpNoneOfItsOwnFunctions)
{
    const Names own = Defined(NIB_RENDERER_FILE, "TW");
    const Names lookedUp = LookedUp(NIB_RENDERER_FILE);

    EXPECT_GE(own.size(), 300u);
    EXPECT_EQ(lookedUp.count("eglInitialize"), 1u);
    EXPECT_EQ(Both(own, lookedUp), Names());
}

TEST_F(LinkedLibrary, SharesItsVariablesAndTypesWithTheProgram)
{
    const Names lookedUp = LookedUp(NIB_RENDERER_FILE);

    EXPECT_EQ(lookedUp.count("_ZN3Nib15ResourceChecker9textureDbE"), 1u);
    EXPECT_EQ(lookedUp.count("_ZTIN3Nib14ITextureObjectE"), 1u);
}

TEST_F(LinkedLibrary, LooksUpTheLogSoThatAProgramMayTakeItOver)
{
    EXPECT_EQ(LookedUp(NIB_BASE_FILE).count("__android_log_print"), 1u);
    EXPECT_EQ(LookedUp(NIB_RENDERER_FILE).count("__android_log_print"), 1u);
}

TEST_F(LinkedLibrary, ExportsNothingOfTheStandardLibrary)
{
    for (const char* file : {NIB_RENDERER_FILE, NIB_BASE_FILE})
    {
        const Names names = Defined(file, "TWVuDBR");
        EXPECT_GE(names.size(), 100u);
        for (const std::string& name : names)
        {
            const bool ours = name.find("3Nib") != std::string::npos && name.find("St") != 2 &&
                              name.find("NSt") != 2;
            const bool global = name.find("OpenGLExtensions") != std::string::npos ||
                                name.find("IsGLExtensionSupported") != std::string::npos ||
                                name.rfind("__android_log_", 0) == 0 ||
                                name.rfind("ANativeWindow_", 0) == 0;
            EXPECT_TRUE(ours || global) << name << " of " << file;
        }
    }
}

TEST_F(LinkedLibrary, StaysOnceItIsLoaded)
{
    for (const char* file : {NIB_RENDERER_FILE, NIB_BASE_FILE})
    {
        bool stays = false;
        for (const std::string& line : OutputOf(std::string(NIB_READELF) + " -dW '" + file + "'"))
            stays = stays || line.find("NODELETE") != std::string::npos;
        EXPECT_TRUE(stays) << file;
    }
}

#ifdef NDEBUG
constexpr std::uintmax_t kLargest = 409600;
#else
constexpr std::uintmax_t kLargest = 384000; // a tenth more than it is
#endif

TEST_F(LinkedLibrary, IsSmall)
{
    const std::uintmax_t size = StrippedSize(NIB_RENDERER_FILE);

    RecordProperty("bytes", std::to_string(size));
    EXPECT_GE(size, 100000u);
    EXPECT_LE(size, kLargest);
}
