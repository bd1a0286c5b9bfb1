#include "gles/CacheFileNames.h"
#include "gles/CacheFiles.h"
#include "sim/SimDriver.h"

#include <filesystem>

#include <sys/wait.h>
#include <unistd.h>

using Nib::ShaderProgramCache;
using Texts = std::vector<std::string>;
namespace fs = std::filesystem;

namespace
{

/// The number of a process that has ended.
std::string EndedProcess()
{
    const pid_t child = fork();
    if (child == 0)
        _exit(0);
    waitpid(child, nullptr, 0);
    return std::to_string(child);
}

class CacheFileNames : public testing::Test
{
protected:
    CacheFileNames() { fs::create_directory(cache.Path()); }

    void Leave(const std::string& name) { WriteBytes(cache.File(name), Bytes{'x'}); }

    SimDriver driver;
    CacheFolder cache;
};

} // namespace

TEST_F(CacheFileNames, OfAnEndedProcessAreRemovedAtTheStartOfTheCache)
{
    Leave("sh5.dat");
    Leave("sh5.dat." + EndedProcess() + ".0.tmp");
    Leave("sh4294967295.dat." + EndedProcess() + ".17.tmp");

    ShaderProgramCache::GetInstance();

    EXPECT_EQ(cache.Names(), Texts{"sh5.dat"});
    EXPECT_EQ(driver.Log().size(), 0u);
}

TEST_F(CacheFileNames, OfALivingProcessAreLeftAlone)
{
    const std::string living = "sh5.dat." + std::to_string(getppid()) + ".0.tmp";
    Leave(living);

    ShaderProgramCache::GetInstance();

    EXPECT_EQ(cache.Names(), Texts{living});
}

TEST_F(CacheFileNames, OfAnEarlierProcessOfTheSameNumberAreRemoved)
{
    Leave("sh5.dat." + std::to_string(getpid()) + ".3.tmp");

    ShaderProgramCache::GetInstance();

    EXPECT_EQ(cache.Names(), Texts{});
}

TEST_F(CacheFileNames, FilesOfOtherNamesAreNobodysTemporaries)
{
    const std::string ended = EndedProcess();
    const Texts others{"notes.tmp",
                       "sh.dat." + ended + ".0.tmp",
                       "sh5.dat." + ended + ".0.tmp.old",
                       "sh5.dat." + ended + ".tmp",
                       "sh5.dat.-1.0.tmp",
                       "sh5.dat.0.0.tmp",
                       "sh5.dat.99999999999.0.tmp",
                       "sh5.txt." + ended + ".0.tmp"};
    for (const std::string& name : others)
        Leave(name);

    ShaderProgramCache::GetInstance();

    EXPECT_EQ(cache.Names().size(), others.size());
}

TEST_F(CacheFileNames, ALinkUnderTheirNameGoesAndNotWhatItPointsTo)
{
    const TemporaryFolder elsewhere;
    WriteBytes(elsewhere / "victim", Bytes{'v'});
    fs::create_symlink(elsewhere / "victim", cache.File("sh5.dat." + EndedProcess() + ".0.tmp"));

    ShaderProgramCache::GetInstance();

    EXPECT_EQ(cache.Names(), Texts{});
    EXPECT_EQ(ReadBytes(elsewhere / "victim"), Bytes{'v'});
}

TEST_F(CacheFileNames, BehindALinkInPlaceOfTheFolderAreLeftAlone)
{
    const TemporaryFolder elsewhere;
    const std::string stale = elsewhere / ("sh5.dat." + EndedProcess() + ".0.tmp");
    WriteBytes(stale, Bytes{'v'});
    fs::remove(cache.Path());
    fs::create_symlink(elsewhere.Path(), cache.Path());

    ShaderProgramCache::GetInstance();

    EXPECT_TRUE(fs::exists(stale));
}

TEST_F(CacheFileNames, NoTwoNamesAreAlike)
{
    EXPECT_NE(Nib::TemporaryName("/c/sh5.dat"), Nib::TemporaryName("/c/sh5.dat"));
}

TEST(CacheFileNamesKinds, AreToldByTheNameAlone)
{
    using Kind = ShaderProgramCache::FileKind;
    const std::string ended = EndedProcess();

    EXPECT_EQ(ShaderProgramCache::GetFileKind("sh5.dat"), Kind::Program);
    EXPECT_EQ(ShaderProgramCache::GetFileKind("sh05.dat"), Kind::Foreign);
    EXPECT_EQ(ShaderProgramCache::GetFileKind("sh5.data"), Kind::Foreign);
    EXPECT_EQ(ShaderProgramCache::GetFileKind("notes.txt"), Kind::Foreign);
    EXPECT_EQ(ShaderProgramCache::GetFileKind(("sh5.dat." + ended + ".0.tmp").c_str()),
              Kind::Leftover);
    EXPECT_EQ(ShaderProgramCache::GetFileKind(
                  ("sh5.dat." + std::to_string(getppid()) + ".0.tmp").c_str()),
              Kind::BeingWritten);
}

TEST(CacheFileCheck, TellsWhatAFileHoldsOrWhatIsWrongWithIt)
{
    const SimDriver driver;
    const TemporaryFolder folder;
    const Bytes whole = FileFields::Of("PROGRAM", {"a_pos"}).File();
    WriteBytes(folder / "whole", whole);
    WriteBytes(folder / "short", Bytes(whole.begin(), whole.begin() + 43));
    Bytes flipped = whole;
    flipped[41] ^= 1;
    WriteBytes(folder / "flipped", flipped);

    ShaderProgramCache::BinaryShader record;
    EXPECT_EQ(ShaderProgramCache::CheckFile((folder / "whole").c_str(), &record), "");
    EXPECT_EQ(ProgramText(record), "PROGRAM");
    EXPECT_EQ(record.attributes, Texts{"a_pos"});
    EXPECT_EQ(ShaderProgramCache::CheckFile((folder / "short").c_str(), nullptr),
              "cut short in the program");
    EXPECT_EQ(ShaderProgramCache::CheckFile((folder / "flipped").c_str(), nullptr),
              "a wrong checksum");
    EXPECT_EQ(ShaderProgramCache::CheckFile((folder / "none").c_str(), nullptr),
              "cannot be opened: No such file or directory");
    EXPECT_EQ(driver.Log().size(), 0u);
}
