#include "gles/TemporaryFiles.h"
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

class TemporaryFiles : public testing::Test
{
protected:
    TemporaryFiles() { fs::create_directory(cache.Path()); }

    void Leave(const std::string& name) { WriteBytes(cache.File(name), Bytes{'x'}); }

    SimDriver driver;
    CacheFolder cache;
};

} // namespace

TEST_F(TemporaryFiles, OfAnEndedProcessAreRemovedAtTheStartOfTheCache)
{
    Leave("sh5.dat");
    Leave("sh5.dat." + EndedProcess() + ".0.tmp");
    Leave("sh4294967295.dat." + EndedProcess() + ".17.tmp");

    ShaderProgramCache::GetInstance();

    EXPECT_EQ(cache.Names(), Texts{"sh5.dat"});
    EXPECT_EQ(driver.Log().size(), 0u);
}

TEST_F(TemporaryFiles, OfALivingProcessAreLeftAlone)
{
    const std::string living = "sh5.dat." + std::to_string(getppid()) + ".0.tmp";
    Leave(living);

    ShaderProgramCache::GetInstance();

    EXPECT_EQ(cache.Names(), Texts{living});
}

TEST_F(TemporaryFiles, OfAnEarlierProcessOfTheSameNumberAreRemoved)
{
    Leave("sh5.dat." + std::to_string(getpid()) + ".3.tmp");

    ShaderProgramCache::GetInstance();

    EXPECT_EQ(cache.Names(), Texts{});
}

TEST_F(TemporaryFiles, FilesOfOtherNamesAreNobodysTemporaries)
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

TEST_F(TemporaryFiles, ALinkUnderTheirNameGoesAndNotWhatItPointsTo)
{
    const TemporaryFolder elsewhere;
    WriteBytes(elsewhere / "victim", Bytes{'v'});
    fs::create_symlink(elsewhere / "victim", cache.File("sh5.dat." + EndedProcess() + ".0.tmp"));

    ShaderProgramCache::GetInstance();

    EXPECT_EQ(cache.Names(), Texts{});
    EXPECT_EQ(ReadBytes(elsewhere / "victim"), Bytes{'v'});
}

TEST_F(TemporaryFiles, BehindALinkInPlaceOfTheFolderAreLeftAlone)
{
    const TemporaryFolder elsewhere;
    const std::string stale = elsewhere / ("sh5.dat." + EndedProcess() + ".0.tmp");
    WriteBytes(stale, Bytes{'v'});
    fs::remove(cache.Path());
    fs::create_symlink(elsewhere.Path(), cache.Path());

    ShaderProgramCache::GetInstance();

    EXPECT_TRUE(fs::exists(stale));
}

TEST_F(TemporaryFiles, NoTwoNamesAreAlike)
{
    EXPECT_NE(Nib::TemporaryName("/c/sh5.dat"), Nib::TemporaryName("/c/sh5.dat"));
}
