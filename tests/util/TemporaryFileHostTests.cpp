// SPDX-License-Identifier: MIT
// The result of a temporary file, whatever already exists under the host's name.
#include <cstdarg>
#include <filesystem>
#include <string>
#include <vector>

#include <fcntl.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/stat.h>

#include "fl/filesystem/operations.hpp"
#include "support/GitFixture.hpp"
#include "support/interposition.hpp"
#include "support/readFile.hpp"
#include "support/text.hpp"
#include "util/temporaryFile.hpp"

namespace
{

/// The name that the host gives next.
std::string &nextName()
{
    static std::string name;
    return name;
}

/// A plain variable: open runs before and after everything else.
bool isFollowing = false;

/// The flags with which the file of that name was opened.
std::vector<int> &openings()
{
    static std::vector<int> flags;
    return flags;
}

} // namespace

/// Stands in the place of the host's. Makes no file: some hosts give nothing but a name.
ustring fl::filesystem::tmpnam(const ustring & /*folder*/, const ustring & /*prefix*/,
                               const ustring & /*extension*/)
{
    return vclink::test::asUtf16(nextName());
}

extern "C"
{
#pragma GCC visibility push(default)

    int open(const char *path, int flags, ...)
    {
        static auto *const real = vclink::test::findNext<int(const char *, int, ...)>("open");
        va_list arguments;
        va_start(arguments, flags);
        const mode_t mode = vclink::test::readMode(flags, arguments);
        va_end(arguments);
        if (isFollowing && path == nextName())
            openings().push_back(flags);
        return real(path, flags, mode);
    }

#pragma GCC visibility pop
}

namespace
{

namespace fs = std::filesystem;
namespace git = vclink::git;
using testing::IsEmpty;
using vclink::test::asBytes;
using vclink::test::readFile;

class TemporaryFileHost : public vclink::test::GitFixture
{
  protected:
    TemporaryFileHost()
    {
        nextName() = folder() / "given";
        openings().clear();
        isFollowing = true;
    }
    ~TemporaryFileHost() override
    {
        isFollowing = false;
    }
    static void writeThere()
    {
        const std::string bytes = "bytes";
        EXPECT_EQ(asBytes(git::writeTemporaryFile(bytes.data(), bytes.size())), nextName());
    }
    std::string read(const std::string &name) const
    {
        return readFile(folder() / name);
    }

    vclink::test::GitRepository files_{folder().path()};
};

TEST_F(TemporaryFileHost, MayGiveNothingButAName)
{
    writeThere();
    EXPECT_EQ(read("given"), "bytes");
    EXPECT_EQ(fs::status(nextName()).permissions(), fs::perms(0600));
    ASSERT_EQ(openings().size(), 2U);
    EXPECT_EQ(openings()[0] & (O_CREAT | O_EXCL), O_CREAT | O_EXCL);
    EXPECT_EQ(openings()[1] & (O_CREAT | O_NOFOLLOW), O_NOFOLLOW);
}

TEST_F(TemporaryFileHost, MayHaveMadeTheFileWhichIsNotMadeAgain)
{
    files_.write("given", "");
    files_.setMode("given", 0640);
    writeThere();
    EXPECT_EQ(read("given"), "bytes");
    EXPECT_EQ(fs::status(nextName()).permissions(), fs::perms(0640));
    ASSERT_EQ(openings().size(), 1U);
    EXPECT_EQ(openings()[0] & (O_CREAT | O_NOFOLLOW), O_NOFOLLOW);
}

TEST_F(TemporaryFileHost, GivesANameThatHasBecomeALink)
{
    files_.write("precious", "precious");
    for (const std::string target : {"precious", "missing"})
    {
        files_.symlink(target, "given");
        writeThere();
        EXPECT_EQ(fs::read_symlink(nextName()), target);
        EXPECT_THAT(openings(), IsEmpty());
        fs::remove(nextName());
    }
    EXPECT_EQ(read("precious"), "precious");
    EXPECT_FALSE(fs::exists(folder() / "missing"));
}

TEST_F(TemporaryFileHost, GivesANameThatHasBecomeAFolderOrAPipe)
{
    fs::create_directory(nextName());
    writeThere();
    EXPECT_TRUE(fs::is_directory(nextName()));
    fs::remove(nextName());
    ASSERT_EQ(::mkfifo(nextName().c_str(), 0600), 0);
    writeThere();
    EXPECT_TRUE(fs::is_fifo(nextName()));
    EXPECT_THAT(openings(), IsEmpty());
}

} // namespace
