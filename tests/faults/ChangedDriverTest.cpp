#include "faults/LifeRecord.h"
#include "gles/CacheFiles.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <iostream>

// The program binaries of one driver offered to another, which an update or another device brings.

namespace
{

using Files = std::map<std::string, Bytes>;

SimGpu Driver(const char* version)
{
    return SimGpu::Named("Mali-G72").WithFrontBuffer().WithVersion(version);
}

const char* const kOld = "OpenGL ES 3.2 v1.r19p0";
const char* const kNew = "OpenGL ES 3.2 v1.r26p0";

class ChangedDriver : public testing::Test
{
protected:
    LifeRecord Live(const SimGpu& gpu)
    {
        LifeRecord life = LiveOnce(gpu, {}, m_folder / "sdk");
        EXPECT_EQ(life.run.end, "") << life.run.messages << life.run.stuck;
        EXPECT_EQ(life.notes, std::vector<std::string>{});
        return life;
    }

    /// What @p gpu draws and stores when it finds no file.
    static LifeRecord Afresh(const SimGpu& gpu) { return LiveOnce(gpu, {}); }

    std::string File(const std::string& name) const { return m_folder / ("RendererCache/" + name); }

    Files Contents() const
    {
        Files files;
        for (const auto& entry : std::filesystem::directory_iterator(m_folder / "RendererCache"))
            files[entry.path().filename().string()] = ReadBytes(entry.path().string());
        return files;
    }

    static long Compilations(const LifeRecord& life)
    {
        return std::count(life.calls.begin(), life.calls.end(), "glCompileShader");
    }

    static bool TellsOfARefusal(const LifeRecord& life)
    {
        return std::any_of(
            life.log.begin(), life.log.end(),
            [](const std::string& line)
            { return line.find("is not valid. Need to recreate it") != std::string::npos; });
    }

    /// A driver that takes the place of the old one: it refuses, draws right, and from its second
    /// life on loads its own binaries without a word.
    void ExpectTakeOver(const SimGpu& successor, const char* how)
    {
        Live(Driver(kOld));
        const Files before = Contents();
        ASSERT_EQ(before.size(), 2u);

        const LifeRecord first = Live(successor);
        const LifeRecord second = Live(successor);

        EXPECT_TRUE(TellsOfARefusal(first));
        EXPECT_EQ(first.pictures, Afresh(successor).pictures);
        const Files after = Contents();
        ASSERT_EQ(after.size(), 2u);
        for (const auto& [name, bytes] : before)
            EXPECT_NE(after.at(name), bytes) << name;
        EXPECT_FALSE(TellsOfARefusal(second));
        EXPECT_EQ(second.pictures, first.pictures);
        EXPECT_EQ(Compilations(second), 0);
        std::cout << "RELIABILITY | binaries of another driver offered: " << how
                  << " | 2 programs | " << (HasFailure() ? 2 : 0) << "\n";
    }

private:
    TemporaryFolder m_folder;
};

} // namespace

TEST_F(ChangedDriver, ThatDoesNotLinkThemBuildsAndReplacesThem)
{
    ExpectTakeOver(Driver(kNew), "link status 0");
}

TEST_F(ChangedDriver, ThatDoesNotKnowTheirFormatBuildsAndReplacesThem)
{
    ExpectTakeOver(Driver(kOld).WithProgramBinaryFormats({0x9130}), "an unknown format, GL error");
}

TEST_F(ChangedDriver, WithoutAnyFormatBuildsThemAndTheNextOneBuildsThemAgain)
{
    Live(Driver(kOld));
    const Files before = Contents();
    const SimGpu without = Driver(kNew).WithoutProgramBinaries();

    const LifeRecord life = Live(without);

    EXPECT_TRUE(TellsOfARefusal(life));
    EXPECT_EQ(life.pictures, Afresh(without).pictures);
    for (const auto& [name, bytes] : Contents()) // what it can store of a program: no bytes
        EXPECT_NE(bytes, before.at(name));
    const LifeRecord back = Live(Driver(kOld));
    EXPECT_FALSE(TellsOfARefusal(back)); // a file without a program does not even load
    EXPECT_EQ(back.pictures, Afresh(Driver(kOld)).pictures);
    EXPECT_EQ(Contents(), before);
    std::cout << "RELIABILITY | binaries of another driver offered: no formats, and back again | 2 "
                 "programs | "
              << (HasFailure() ? 2 : 0) << "\n";
}

// A file holds no key, and a binary that the driver links is taken: so a file of another program
// under this one's name draws with the other program. The cache therefore never makes such names.
TEST_F(ChangedDriver, ABinaryOfAnotherProgramIsTakenForItsName)
{
    Live(Driver(kOld));
    const Files before = Contents();
    const std::string one = before.begin()->first;
    const std::string other = before.rbegin()->first;
    WriteBytes(File(one), before.at(other));
    WriteBytes(File(other), before.at(one));

    const LifeRecord mixed = Live(Driver(kOld));

    EXPECT_FALSE(TellsOfARefusal(mixed));
    EXPECT_NE(mixed.pictures, Afresh(Driver(kOld)).pictures);

    // What helps is to empty the folder.
    std::filesystem::remove(File(one));
    std::filesystem::remove(File(other));
    EXPECT_EQ(Live(Driver(kOld)).pictures, Afresh(Driver(kOld)).pictures);
    EXPECT_EQ(Contents(), before);
}
