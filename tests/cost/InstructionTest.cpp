#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iostream>
#include <map>
#include <string>

#include <unistd.h>

// The instructions of each hot path, as callgrind counts them, which do not depend on what else the
// machine does.

namespace
{

constexpr int kTimes = 100;

/// By function, those that it spent itself and in what it called.
using Instructions = std::map<std::string, long>;

/// Reads callgrind's file: behind "cfn=", which names what is called, and "calls=", a line with the
/// place of the call and its cost.
Instructions ReadProfile(const std::string& file)
{
    Instructions instructions;
    std::ifstream lines(file);
    std::string called;
    for (std::string line; std::getline(lines, line);)
    {
        if (line.rfind("cfn=", 0) == 0)
            called = line.substr(4, line.find('(') - 4);
        if (line.rfind("calls=", 0) != 0 || !std::getline(lines, line))
            continue;
        instructions[called] += std::stol(line.substr(line.find(' ') + 1));
    }
    return instructions;
}

class Cost : public testing::Test
{
protected:
    void SetUp() override
    {
        if (!NIB_IS_PLAIN_BUILD)
            GTEST_SKIP() << "the instructions of sanitizers or coverage would be counted, too";
        if (std::string(NIB_VALGRIND).empty())
            GTEST_SKIP() << "valgrind, which counts instructions, was not there at configuration";
        const std::string file = (std::filesystem::temp_directory_path() / "nib-cost-").string() +
                                 std::to_string(getpid());
        const std::string command = std::string("LD_BIND_NOW=1 ") + NIB_VALGRIND +
                                    " --tool=callgrind --compress-strings=no --compress-pos=no"
                                    " --callgrind-out-file=" +
                                    file + " " + NIB_HOT_PATHS + " " + std::to_string(kTimes) +
                                    " >" + file + ".log 2>&1";
        ASSERT_EQ(std::system(command.c_str()), 0) << std::ifstream(file + ".log").rdbuf();
        m_profile = ReadProfile(file);
        std::filesystem::remove(file);
        std::filesystem::remove(file + ".log");
    }

    /// Of one round of a path.
    long Of(const std::string& path) const
    {
        const auto found = m_profile.find("HotPaths::" + path);
        EXPECT_NE(found, m_profile.end()) << path << " is not in the profile";
        return found == m_profile.end() ? -1 : found->second / kTimes;
    }

    /// What the library adds to the GL calls of a path.
    long Own(const std::string& path) const
    {
        const long gl = Of("Gl" + path);
        const long all = Of(path);
        RecordProperty(path, std::to_string(all) + " beside " + std::to_string(gl));
        std::cout << path << ": " << all << " instructions beside " << gl << "\n";
        EXPECT_GT(gl, 0);
        return all - gl;
    }

private:
    Instructions m_profile;
};

} // namespace

#ifdef NDEBUG
constexpr bool kIsRelease = true;
#else
constexpr bool kIsRelease = false;
#endif

// What is shipped may cost little; what is built for tests, with less optimisation, a tenth more
// than it does. One test, because the profile takes most of its time.
TEST_F(Cost, OfEachHotPathIsFewInstructions)
{
    EXPECT_LE(Own("Draw"), kIsRelease ? 150 : 200);
    EXPECT_LE(Own("State"), kIsRelease ? 160 : 400);
    EXPECT_LE(Own("Update"), 60);
    EXPECT_LE(Own("SetData"), 100);
    EXPECT_LE(Own("ReadPixels"), 25);
    EXPECT_LE(Own("Present"), 290);
    EXPECT_LE(Own("TiledPresent"), 750);
    EXPECT_LE(Own("Program"), 1900);
    EXPECT_LE(Of("Filtered"), 40);
    EXPECT_LE(Of("Product3"), kIsRelease ? 70 : 76);
    EXPECT_LE(Of("Product4"), kIsRelease ? 92 : 99);
    EXPECT_LE(Of("Inverse3"), kIsRelease ? 102 : 137);
    EXPECT_LE(Of("Inverse4"), kIsRelease ? 236 : 371);
    EXPECT_LE(Of("MapRect"), kIsRelease ? 70 : 85);
}
