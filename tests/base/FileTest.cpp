#include "base/ChildProcess.h"

#include <nib/base.h>

#include <gtest/gtest.h>

#include <cerrno>
#include <csignal>
#include <cstdint>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <set>
#include <sstream>

#include <fcntl.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <unistd.h>

using namespace Nib;

namespace
{

class FileTest : public testing::Test
{
protected:
    bool Open(File& file, const std::string& name, const char* mode, bool createParents = false)
    {
        const String path((folder / name).c_str());
        errno = 0;
        return file.Construct(&path, mode, createParents);
    }

    void Put(const std::string& name, const std::string& content)
    {
        std::ofstream(folder / name, std::ios::binary) << content;
    }

    std::string Content(const std::string& name)
    {
        std::ostringstream content;
        content << std::ifstream(folder / name, std::ios::binary).rdbuf();
        return content.str();
    }

    bool Exists(const std::string& name) { return std::filesystem::exists(folder / name); }

    TemporaryFolder folder;
};

std::set<int> OpenDescriptors()
{
    std::set<int> open;
    for (int descriptor = 0; descriptor < 256; ++descriptor)
    {
        if (fcntl(descriptor, F_GETFD) >= 0)
            open.insert(descriptor);
    }
    return open;
}

} // namespace

TEST_F(FileTest, ReadSomeTakesWhatOneCallBrings)
{
    Put("file", "0123456789");
    File file;
    ASSERT_TRUE(Open(file, "file", "r"));
    char bytes[8] = {};
    EXPECT_EQ(file.ReadSome(bytes, 8), 8u);
    EXPECT_EQ(std::string(bytes, 8), "01234567");
    EXPECT_EQ(file.ReadSome(bytes, 8), 2u);
    EXPECT_EQ(std::string(bytes, 2), "89");
    EXPECT_EQ(file.ReadSome(bytes, 8), 0u);
}

TEST_F(FileTest, ReadSomeOfNoFileBringsNothing)
{
    File file;
    char byte = 0;
    EXPECT_EQ(file.ReadSome(&byte, 1), 0u);
    EXPECT_EQ(errno, EBADF);
}

TEST_F(FileTest, OpensAFileInAFolderByItsName)
{
    Put("file", "content");
    const int descriptor = open(folder.Path().c_str(), O_PATH | O_DIRECTORY);
    char bytes[7] = {};
    {
        File file;
        ASSERT_TRUE(file.ConstructIn(descriptor, "file", "r"));
        EXPECT_EQ(file.Read(bytes, 1, 7), 7u);
        EXPECT_FALSE(file.ConstructIn(descriptor, "none", "r")) << "and closes the one before";
        EXPECT_EQ(errno, ENOENT);
        EXPECT_EQ(file.Read(bytes, 1, 7), 0u);
        EXPECT_FALSE(file.ConstructIn(descriptor, "file", "q"));
        EXPECT_EQ(errno, EINVAL);
    }
    EXPECT_EQ(std::string(bytes, 7), "content");
    close(descriptor);
}

TEST_F(FileTest, WritesAndReadsBytes)
{
    File file;
    ASSERT_TRUE(Open(file, "a", "wb"));
    EXPECT_EQ(file.Write("hello", 1, 5), 5u);
    EXPECT_EQ(file.Close(), 0);
    EXPECT_EQ(Content("a"), "hello");

    char bytes[8] = {};
    ASSERT_TRUE(Open(file, "a", "rb"));
    EXPECT_EQ(file.Read(bytes, 1, 8), 5u);
    EXPECT_STREQ(bytes, "hello");
}

TEST_F(FileTest, CountsItemsNotBytes)
{
    const std::uint64_t value = 0x0123456789ABCDEF;
    File file;
    ASSERT_TRUE(Open(file, "a", "wb"));
    EXPECT_EQ(file.Write(&value, 8, 1), 1u);

    std::uint64_t read = 0;
    ASSERT_TRUE(Open(file, "a", "rb"));
    EXPECT_EQ(file.Read(&read, 8, 1), 1u);
    EXPECT_EQ(read, 0x0123456789ABCDEFu);
}

TEST_F(FileTest, AnItemThatIsCutOffDoesNotCount)
{
    Put("a", "1234567"); // one byte short of one item, of two and a half
    char bytes[8] = {};
    File file;
    ASSERT_TRUE(Open(file, "a", "rb"));
    EXPECT_EQ(file.Read(bytes, 8, 1), 0u);
    ASSERT_TRUE(Open(file, "a", "rb"));
    EXPECT_EQ(file.Read(bytes, 3, 2), 2u);
    EXPECT_EQ(std::string(bytes, 6), "123456");
}

TEST_F(FileTest, ReadsOnFromWhereItStopped)
{
    Put("a", "abcdef");
    char bytes[4] = {};
    File file;
    ASSERT_TRUE(Open(file, "a", "rb"));
    EXPECT_EQ(file.Read(bytes, 1, 2), 2u);
    EXPECT_EQ(file.Read(bytes, 1, 3), 3u);
    EXPECT_STREQ(bytes, "cde");
    EXPECT_EQ(file.Read(bytes, 1, 3), 1u);
    EXPECT_EQ(file.Read(bytes, 1, 3), 0u);
}

TEST_F(FileTest, EmptyAndImpossibleRequestsMoveNothing)
{
    Put("a", "abc");
    char bytes[4] = {};
    File file;
    ASSERT_TRUE(Open(file, "a", "r+"));
    EXPECT_EQ(file.Read(bytes, 0, 5), 0u);
    EXPECT_EQ(file.Read(bytes, 5, 0), 0u);
    EXPECT_EQ(file.Read(bytes, SIZE_MAX, 2), 0u);
    EXPECT_EQ(file.Write(bytes, SIZE_MAX, 2), 0u);
    EXPECT_EQ(Content("a"), "abc");
}

TEST_F(FileTest, WritingMakesOrEmptiesTheFile)
{
    Put("a", "old text");
    File file;
    ASSERT_TRUE(Open(file, "a", "wb"));
    EXPECT_EQ(Content("a"), "");
    ASSERT_TRUE(Open(file, "b", "wb"));
    EXPECT_TRUE(Exists("b"));
}

TEST_F(FileTest, AppendingWritesBehindTheEnd)
{
    Put("a", "one");
    File file;
    ASSERT_TRUE(Open(file, "a", "ab"));
    EXPECT_EQ(file.Write(" two", 1, 4), 4u);
    EXPECT_EQ(Content("a"), "one two");
}

TEST_F(FileTest, UpdatingReadsAndWrites)
{
    Put("a", "abcdef");
    char bytes[4] = {};
    File file;
    ASSERT_TRUE(Open(file, "a", "r+b"));
    EXPECT_EQ(file.Read(bytes, 1, 2), 2u);
    EXPECT_EQ(file.Write("XY", 1, 2), 2u);
    EXPECT_EQ(Content("a"), "abXYef");

    ASSERT_TRUE(Open(file, "a", "w+"));
    EXPECT_EQ(file.Write("z", 1, 1), 1u);
    EXPECT_EQ(file.Read(bytes, 1, 1), 0u); // at the end, but allowed
}

TEST_F(FileTest, ExclusiveCreationRefusesWhatExists)
{
    Put("a", "kept");
    File file;
    EXPECT_FALSE(Open(file, "a", "wbx"));
    EXPECT_EQ(errno, EEXIST);
    EXPECT_EQ(Content("a"), "kept");
    EXPECT_TRUE(Open(file, "b", "wbx"));
}

TEST_F(FileTest, AMissingFileIsNotOpened)
{
    File file;
    EXPECT_FALSE(Open(file, "missing", "rb"));
    EXPECT_EQ(errno, ENOENT);
    EXPECT_FALSE(Exists("missing"));
}

TEST_F(FileTest, UnknownModesAndNullAreRefused)
{
    const String path((folder / "a").c_str());
    File file;
    for (const char* mode : {"", "q", "rw", "b", "w?", "r+ "})
    {
        errno = 0;
        EXPECT_FALSE(file.Construct(&path, mode, false)) << mode;
        EXPECT_EQ(errno, EINVAL) << mode;
    }
    EXPECT_FALSE(file.Construct(&path, nullptr, false));
    EXPECT_FALSE(file.Construct(nullptr, "rb", false));
    EXPECT_EQ(errno, EINVAL);
    EXPECT_FALSE(Exists("a"));
}

TEST_F(FileTest, ParentsAreMadeOnlyOnRequest)
{
    File file;
    EXPECT_FALSE(Open(file, "x/y/a", "wb"));
    EXPECT_EQ(errno, ENOENT);
    EXPECT_TRUE(Open(file, "x/y/a", "wb", true));
    EXPECT_TRUE(Exists("x/y/a"));
}

TEST_F(FileTest, ProgramsThatTheProcessStartsDoNotInheritIt)
{
    const std::set<int> before = OpenDescriptors();
    File file;
    ASSERT_TRUE(Open(file, "a", "wb"));

    int opened = 0;
    for (const int descriptor : OpenDescriptors())
    {
        if (before.count(descriptor) != 0)
            continue;
        ++opened;
        EXPECT_EQ(fcntl(descriptor, F_GETFD) & FD_CLOEXEC, FD_CLOEXEC);
    }
    EXPECT_EQ(opened, 1);
}

TEST_F(FileTest, IsClosedByCloseByItsEndAndByOpeningAnother)
{
    const std::set<int> before = OpenDescriptors();
    {
        File file;
        ASSERT_TRUE(Open(file, "a", "wb"));
        EXPECT_EQ(OpenDescriptors().size(), before.size() + 1);
        EXPECT_EQ(file.Close(), 0);
        EXPECT_EQ(OpenDescriptors(), before);
        EXPECT_EQ(file.Close(), 0); // nothing more to close
        ASSERT_TRUE(Open(file, "b", "wb"));
        ASSERT_TRUE(Open(file, "c", "wb"));
        EXPECT_EQ(OpenDescriptors().size(), before.size() + 1);
    }
    EXPECT_EQ(OpenDescriptors(), before);
}

TEST_F(FileTest, AClosedFileMovesNothing)
{
    char bytes[4] = {};
    File file;
    EXPECT_EQ(file.Write("abc", 1, 3), 0u);
    EXPECT_EQ(errno, EBADF);
    EXPECT_EQ(file.Read(bytes, 1, 3), 0u);
}

TEST_F(FileTest, WhatIsWrittenIsThereAtOnce)
{
    File file;
    ASSERT_TRUE(Open(file, "a", "wb"));
    EXPECT_EQ(file.Write("abc", 1, 3), 3u);
    EXPECT_EQ(Content("a"), "abc"); // not yet closed
}

TEST_F(FileTest, AFullDiskIsSeenByTheWriteThatMeetsIt)
{
    const String full("/dev/full");
    File file;
    ASSERT_TRUE(file.Construct(&full, "wb", false));
    errno = 0;
    EXPECT_EQ(file.Write("abc", 1, 3), 0u);
    EXPECT_EQ(errno, ENOSPC);
}

TEST_F(FileTest, CountsOnlyWhatTheSystemTook)
{
    const ChildResult child = RunInChild(
        [&]
        {
            std::signal(SIGXFSZ, SIG_IGN);
            const rlimit limit = {10, 10}; // bytes that a file may have
            ASSERT_EQ(setrlimit(RLIMIT_FSIZE, &limit), 0);
            File file;
            ASSERT_TRUE(Open(file, "a", "wb"));
            EXPECT_EQ(file.Write("0123456789abcdef", 1, 16), 10u);
            EXPECT_EQ(errno, EFBIG);
            ASSERT_TRUE(Open(file, "b", "wb"));
            EXPECT_EQ(file.Write("0123456789abcdef", 4, 4), 2u);
        });
    EXPECT_EQ(child.exitCode, 0) << child.Text();
    EXPECT_EQ(Content("a"), "0123456789");
}

TEST_F(FileTest, IsAccessibleAsTheSystemSays)
{
    Put("a", "");
    EXPECT_EQ(File::IsAccessible((folder / "a").c_str(), F_OK), 0);
    EXPECT_EQ(File::IsAccessible(folder.Path().c_str(), 0), 0);
    EXPECT_EQ(File::IsAccessible((folder / "a").c_str(), X_OK), -1);
    EXPECT_NE(File::IsAccessible((folder / "b").c_str(), 0), 0);
    EXPECT_EQ(errno, ENOENT);
    EXPECT_EQ(File::IsAccessible(nullptr, 0), -1);
    EXPECT_EQ(errno, EINVAL);
}

TEST_F(FileTest, UnlinkRemovesAFile)
{
    Put("a", "");
    Put("b", "");
    const String a((folder / "a").c_str());
    EXPECT_EQ(File::Unlink(&a), 0);
    EXPECT_FALSE(Exists("a"));
    EXPECT_EQ(File::Unlink((folder / "b").c_str()), 0);
    EXPECT_FALSE(Exists("b"));

    EXPECT_EQ(File::Unlink(&a), -1);
    EXPECT_EQ(errno, ENOENT);
    EXPECT_EQ(File::Unlink(static_cast<const char*>(nullptr)), -1);
    EXPECT_EQ(errno, EINVAL);
    EXPECT_EQ(File::Unlink(static_cast<const String*>(nullptr)), -1);
}

TEST(Directory, MakesOneFolderForThisUserAlone)
{
    const TemporaryFolder folder;
    const std::string path = folder / "new";

    EXPECT_EQ(Directory::MakeDirectory(path.c_str()), 0);

    struct stat status = {};
    ASSERT_EQ(stat(path.c_str(), &status), 0);
    EXPECT_TRUE(S_ISDIR(status.st_mode));
    EXPECT_EQ(status.st_mode & 0777u, 0700u);
}

TEST(Directory, RefusesWhatExistsAndWhatHasNoParent)
{
    const TemporaryFolder folder;
    EXPECT_EQ(Directory::MakeDirectory(folder.Path().c_str()), -1);
    EXPECT_EQ(errno, EEXIST);
    EXPECT_EQ(Directory::MakeDirectory((folder / "a/b").c_str()), -1);
    EXPECT_EQ(errno, ENOENT);
    EXPECT_EQ(Directory::MakeDirectory(nullptr), -1);
    EXPECT_EQ(errno, EINVAL);
}

TEST(String, TakesACopy)
{
    char text[] = "path";
    String string;
    EXPECT_TRUE(string.Construct(text));
    text[0] = 'X';
    EXPECT_STREQ(string.Get(), "path");
    EXPECT_EQ(string.GetLength(), 4u);
    EXPECT_FALSE(string.IsEmpty());
    EXPECT_EQ(string, String("path"));
    EXPECT_NE(string, String("Xath"));
}

TEST(String, NullLeavesAnEmptyText)
{
    String string("before");
    EXPECT_FALSE(string.Construct(nullptr));
    EXPECT_STREQ(string.Get(), "");
    EXPECT_TRUE(string.IsEmpty());
    EXPECT_STREQ(String().Get(), "");
}
