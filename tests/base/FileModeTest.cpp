#include <nib/base.h>

#include <gtest/gtest.h>

#include <cerrno>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <string>

#include <sys/stat.h>

using Nib::File;
using Nib::String;
namespace fs = std::filesystem;

namespace
{

// The letters of File::Construct that fopen() does not have: "n" and "p".
class FileMode : public testing::Test
{
protected:
    FileMode() : m_mask(umask(0))
    {
        std::string name = (fs::temp_directory_path() / "nib-XXXXXX").string();
        EXPECT_NE(mkdtemp(name.data()), nullptr);
        m_folder = name;
    }
    ~FileMode() override
    {
        umask(m_mask);
        fs::remove_all(m_folder);
    }

    fs::path Path(const char* name) const { return m_folder / name; }

    /// 0, or the errno of a failure.
    static int Open(const fs::path& path, const char* mode)
    {
        const String name(path.c_str());
        File file;
        errno = 0;
        return file.Construct(&name, mode, false) ? 0 : errno;
    }

    static unsigned Permissions(const fs::path& path)
    {
        struct stat status = {};
        return stat(path.c_str(), &status) == 0 ? status.st_mode & 07777u : 0u;
    }

private:
    mode_t m_mask;
    fs::path m_folder;
};

} // namespace

TEST_F(FileMode, WithoutAPANewFileIsForAllThatTheMaskLets)
{
    EXPECT_EQ(Open(Path("file"), "wb"), 0);
    EXPECT_EQ(Permissions(Path("file")), 0666u);
}

TEST_F(FileMode, PMakesANewFileForThisUserAlone)
{
    EXPECT_EQ(Open(Path("written"), "wbp"), 0);
    EXPECT_EQ(Permissions(Path("written")), 0600u);
    EXPECT_EQ(Open(Path("appended"), "ap"), 0);
    EXPECT_EQ(Permissions(Path("appended")), 0600u);
}

TEST_F(FileMode, PLeavesAnExistingFileAsItIs)
{
    EXPECT_EQ(Open(Path("file"), "wb"), 0);
    EXPECT_EQ(Open(Path("file"), "wbp"), 0);
    EXPECT_EQ(Permissions(Path("file")), 0666u);
}

TEST_F(FileMode, NRefusesALinkToAFile)
{
    std::ofstream(Path("file")) << "text";
    fs::create_symlink(Path("file"), Path("link"));
    EXPECT_EQ(Open(Path("link"), "rb"), 0);
    EXPECT_EQ(Open(Path("link"), "rbn"), ELOOP);
    EXPECT_EQ(Open(Path("link"), "wbn"), ELOOP);
    EXPECT_EQ(Open(Path("link"), "abn"), ELOOP);
    EXPECT_EQ(fs::file_size(Path("file")), 4u);
}

TEST_F(FileMode, NRefusesALinkToNothing)
{
    fs::create_symlink(Path("file"), Path("link"));
    EXPECT_EQ(Open(Path("link"), "wbn"), ELOOP);
    EXPECT_FALSE(fs::exists(Path("file")));
}

TEST_F(FileMode, NFollowsALinkInTheFoldersBeforeTheFile)
{
    fs::create_directory(Path("folder"));
    fs::create_directory_symlink(Path("folder"), Path("link"));
    EXPECT_EQ(Open(Path("link/file"), "wbn"), 0);
    EXPECT_TRUE(fs::exists(Path("folder/file")));
}

TEST_F(FileMode, NOpensAnOrdinaryFile)
{
    EXPECT_EQ(Open(Path("file"), "wbxnp"), 0);
    EXPECT_EQ(Open(Path("file"), "rbn"), 0);
    EXPECT_EQ(Open(Path("file"), "wbxnp"), EEXIST);
}

TEST_F(FileMode, NDoesNotWaitForTheOtherEndOfAPipe)
{
    ASSERT_EQ(mkfifo(Path("pipe").c_str(), 0600), 0);
    const String name(Path("pipe").c_str());
    File file;
    char byte = 0;

    EXPECT_TRUE(file.Construct(&name, "rbn", false));
    EXPECT_EQ(file.Read(&byte, 1, 1), 0u);
}

TEST_F(FileMode, OtherLettersAreRefused)
{
    EXPECT_EQ(Open(Path("file"), "wq"), EINVAL);
    EXPECT_EQ(Open(Path("file"), "n"), EINVAL);
    EXPECT_FALSE(fs::exists(Path("file")));
}
