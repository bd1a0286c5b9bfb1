#include "gles/CacheFiles.h"
#include "sim/SimDriver.h"

#include <nib/shader_cache.h>

#include <cerrno>
#include <filesystem>

#include <unistd.h>

using Nib::ShaderProgramCache;
using Nib::System;
using Texts = std::vector<std::string>;
namespace fs = std::filesystem;

namespace
{

// Where the folder of program binaries is, and what happens when it cannot be there.
class CacheDirectory : public testing::Test
{
protected:
    Texts Errors() const { return driver.LogTexts(ANDROID_LOG_ERROR); }
    Texts Infos() const { return driver.LogTexts(ANDROID_LOG_INFO); }
    Texts Warnings() const { return driver.LogTexts(ANDROID_LOG_WARN); }

    SimDriver driver;
    TemporaryFolder folder;
};

} // namespace

TEST_F(CacheDirectory, LiesBesideTheLastPartOfThePath)
{
    System::SetSDKCacheDirectoryPath((folder / "sdk").c_str());
    ShaderProgramCache* const cache = ShaderProgramCache::GetInstance();

    EXPECT_TRUE(fs::is_directory(folder / "RendererCache"));
    EXPECT_FALSE(fs::exists(folder / "sdk"));
    EXPECT_EQ(Infos(), (Texts{"bool Nib::ShaderProgramCache::Init() - Make cache directory: " +
                              folder.Path() + "/RendererCache"}));
    EXPECT_EQ(Errors(), Texts{});
    EXPECT_TRUE(cache->SetBinaryShader(Record(305419896, "P")));
    EXPECT_TRUE(fs::exists(folder / "RendererCache/sh305419896.dat"));
}

TEST_F(CacheDirectory, LiesInsideAPathThatEndsInASlash)
{
    ASSERT_TRUE(fs::create_directory(folder / "sdk"));
    System::SetSDKCacheDirectoryPath((folder / "sdk/").c_str());
    ShaderProgramCache::GetInstance();

    EXPECT_TRUE(fs::is_directory(folder / "sdk/RendererCache"));
    EXPECT_EQ(Infos(), (Texts{"bool Nib::ShaderProgramCache::Init() - Make cache directory: " +
                              folder.Path() + "/sdk/RendererCache"}));
}

TEST_F(CacheDirectory, TakesABackslashForADelimiter)
{
    System::SetSDKCacheDirectoryPath((folder / "cache\\sdk").c_str());
    ASSERT_TRUE(fs::create_directory(folder / "cache"));
    ShaderProgramCache::GetInstance();

    EXPECT_TRUE(fs::is_directory(folder / "cache/RendererCache"));
}

TEST_F(CacheDirectory, TakesTheLastOfMixedDelimiters)
{
    System::SetSDKCacheDirectoryPath((folder / "a\\b/sdk").c_str());
    ASSERT_TRUE(fs::create_directory(folder / "a\\b"));
    ShaderProgramCache::GetInstance();

    EXPECT_TRUE(fs::is_directory(folder / "a\\b/RendererCache"));
}

TEST_F(CacheDirectory, IsThePathItselfWhereItHasNoDelimiter)
{
    ASSERT_EQ(chdir(folder.Path().c_str()), 0);
    System::SetSDKCacheDirectoryPath("cache");
    ShaderProgramCache* const cache = ShaderProgramCache::GetInstance();

    EXPECT_TRUE(fs::is_directory(folder / "cache"));
    EXPECT_EQ(Errors(), (Texts{"bool Nib::ShaderProgramCache::Init() Path delimiter not found in "
                               "given Cache path"}));
    EXPECT_EQ(Infos(),
              (Texts{"bool Nib::ShaderProgramCache::Init() - Make cache directory: cache"}));
    EXPECT_TRUE(cache->SetBinaryShader(Record(7, "P")));
    EXPECT_TRUE(fs::exists(folder / "cache/sh7.dat"));
    ASSERT_EQ(chdir("/"), 0);
}

TEST_F(CacheDirectory, IsForThisUserAlone)
{
    System::SetSDKCacheDirectoryPath((folder / "sdk").c_str());
    const mode_t mask = umask(0);
    ShaderProgramCache* const cache = ShaderProgramCache::GetInstance();
    EXPECT_TRUE(cache->SetBinaryShader(Record(1, "P")));
    umask(mask);

    EXPECT_EQ(Permissions(folder / "RendererCache"), 0700u);
    EXPECT_EQ(Permissions(folder / "RendererCache/sh1.dat"), 0600u);
}

TEST_F(CacheDirectory, ThatExistsIsTakenAsItIs)
{
    System::SetSDKCacheDirectoryPath((folder / "sdk").c_str());
    ASSERT_TRUE(fs::create_directory(folder / "RendererCache"));
    ShaderProgramCache* const cache = ShaderProgramCache::GetInstance();

    EXPECT_EQ(driver.Log().size(), 0u);
    EXPECT_TRUE(cache->SetBinaryShader(Record(1, "P")));
}

TEST_F(CacheDirectory, IsNotMadeBehindALinkToNothing)
{
    System::SetSDKCacheDirectoryPath((folder / "sdk").c_str());
    fs::create_symlink(folder / "elsewhere", folder / "RendererCache");
    ShaderProgramCache::GetInstance();

    EXPECT_FALSE(fs::exists(folder / "elsewhere"));
    EXPECT_EQ(Errors(), (Texts{"bool Nib::ShaderProgramCache::Init() : Fail to make the shader "
                               "cache directory. errno = 17"}));
}

TEST_F(CacheDirectory, ASecondInitOnlyWarns)
{
    System::SetSDKCacheDirectoryPath((folder / "sdk").c_str());
    ShaderProgramCache* const cache = ShaderProgramCache::GetInstance();
    EXPECT_EQ(Warnings(), Texts{});
    driver.ForgetLog();
    System::SetSDKCacheDirectoryPath((folder / "elsewhere/sdk").c_str());

    EXPECT_TRUE(cache->Init());
    EXPECT_EQ(Warnings(), (Texts{"bool Nib::ShaderProgramCache::Init() - Already initialized."}));
    EXPECT_EQ(driver.Log().size(), 1u);
    EXPECT_TRUE(cache->SetBinaryShader(Record(1, "P")));
    EXPECT_TRUE(fs::exists(folder / "RendererCache/sh1.dat"));
}

TEST_F(CacheDirectory, IsMissingWithoutAPath)
{
    System::SetSDKCacheDirectoryPath(nullptr);
    ShaderProgramCache* const cache = ShaderProgramCache::GetInstance();

    ASSERT_NE(cache, nullptr);
    const std::string line =
        "bool Nib::ShaderProgramCache::Init() - SDK cache path is NULL or empty";
    EXPECT_EQ(Errors(), Texts{line});
    EXPECT_FALSE(cache->Init());
    EXPECT_EQ(Errors(), (Texts{line, line}));
    EXPECT_EQ(ShaderProgramCache::GetInstance(), cache);
}

TEST_F(CacheDirectory, IsMissingWithAnEmptyPath)
{
    System::SetSDKCacheDirectoryPath("");
    ShaderProgramCache* const cache = ShaderProgramCache::GetInstance();

    EXPECT_EQ(Errors(),
              (Texts{"bool Nib::ShaderProgramCache::Init() - SDK cache path is NULL or empty"}));
    EXPECT_EQ(cache->GetBinaryShader(1), nullptr);
}

TEST_F(CacheDirectory, ThatCannotBeMadeIsReportedWithErrno)
{
    System::SetSDKCacheDirectoryPath((folder / "missing/sdk").c_str());
    ShaderProgramCache* const cache = ShaderProgramCache::GetInstance();

    EXPECT_EQ(Infos(), (Texts{"bool Nib::ShaderProgramCache::Init() - Make cache directory: " +
                              folder.Path() + "/missing/RendererCache"}));
    EXPECT_EQ(Errors(), (Texts{"bool Nib::ShaderProgramCache::Init() : Fail to make the shader "
                               "cache directory. errno = 2"}));
    EXPECT_EQ(cache->GetBinaryShader(1), nullptr);
}

TEST_F(CacheDirectory, CanBeMadeLater)
{
    System::SetSDKCacheDirectoryPath((folder / "missing/sdk").c_str());
    ShaderProgramCache* const cache = ShaderProgramCache::GetInstance();
    ASSERT_TRUE(fs::create_directory(folder / "missing"));

    EXPECT_TRUE(cache->Init());
    EXPECT_TRUE(fs::is_directory(folder / "missing/RendererCache"));
}

// ---- an uninitialised cache ---------------------------------------------------------------------

TEST_F(CacheDirectory, WithoutOneNothingIsFoundAlthoughItIsKept)
{
    System::SetSDKCacheDirectoryPath((folder / "missing/sdk").c_str());
    ShaderProgramCache* const cache = ShaderProgramCache::GetInstance();
    driver.ForgetLog();

    EXPECT_FALSE(cache->SetBinaryShader(Record(5, "P")));
    EXPECT_EQ(cache->GetBinaryShader(5), nullptr);
    const std::string file = folder.Path() + "/missing/RendererCache/sh5.dat";
    EXPECT_EQ(Errors(),
              (Texts{"bool Nib::ShaderProgramCache::SaveToFile(const "
                     "ShaderProgramCache::BinaryShader *) Failed to create shader binary file. "
                     "Err=2. File=" +
                         file,
                     "bool Nib::ShaderProgramCache::SetBinaryShader(const "
                     "ShaderProgramCache::BinaryShader &) - Failed to save cloned binary "
                     "shader"}));

    // What was kept in memory is there when the folder is.
    ASSERT_TRUE(fs::create_directory(folder / "missing"));
    ASSERT_TRUE(cache->Init());
    ASSERT_NE(cache->GetBinaryShader(5), nullptr);
    EXPECT_EQ(ProgramText(*cache->GetBinaryShader(5)), "P");
}

TEST_F(CacheDirectory, WithoutAPathNothingIsWrittenToTheRoot)
{
    System::SetSDKCacheDirectoryPath(nullptr);
    ShaderProgramCache* const cache = ShaderProgramCache::GetInstance();
    driver.ForgetLog();

    EXPECT_FALSE(cache->SetBinaryShader(Record(305419896, "P")));
    EXPECT_EQ(Errors(),
              (Texts{"bool Nib::ShaderProgramCache::SaveToFile(const "
                     "ShaderProgramCache::BinaryShader *) Failed to create shader binary file. "
                     "Err=2. File=/sh305419896.dat",
                     "bool Nib::ShaderProgramCache::SetBinaryShader(const "
                     "ShaderProgramCache::BinaryShader &) - Failed to save cloned binary "
                     "shader"}));
    EXPECT_FALSE(fs::exists("/sh305419896.dat"));
}

TEST_F(CacheDirectory, WithoutOneAReplacementIsReportedAsSuch)
{
    System::SetSDKCacheDirectoryPath(nullptr);
    ShaderProgramCache* const cache = ShaderProgramCache::GetInstance();
    EXPECT_FALSE(cache->SetBinaryShader(Record(5, "P")));
    driver.ForgetLog();

    EXPECT_FALSE(cache->SetBinaryShader(Record(5, "Q")));
    EXPECT_EQ(Warnings(), (Texts{"bool Nib::ShaderProgramCache::SetBinaryShader(const "
                                 "ShaderProgramCache::BinaryShader &) - Binary shader already in "
                                 "cache. Replace with new version"}));
    ASSERT_EQ(Errors().size(), 2u);
    EXPECT_EQ(Errors()[1], "bool Nib::ShaderProgramCache::SetBinaryShader(const "
                           "ShaderProgramCache::BinaryShader &) - Failed to save binary shader");
}
