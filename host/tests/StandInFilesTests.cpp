// SPDX-License-Identifier: MIT
#include <filesystem>
#include <string>
#include <vector>

#include <boost/filesystem/exception.hpp>
#include <fcntl.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <unistd.h>

#include "fl/filesystem/detail/path_text.hpp"
#include "fl/filesystem/fstream.hpp"
#include "fl/filesystem/operations.hpp"
#include "support/Descriptors.hpp"
#include "support/ElementOrder.hpp"
#include "support/Files.hpp"
#include "support/UnprivilegedUser.hpp"

using fl::filesystem::basic_ifstream;
using fl::filesystem::basic_ofstream;
using fl::i18n::to_string;
using fl::i18n::ustring_to_utf8;
using fl::i18n::utf8_to_ustring;
using testing::ElementsAre;
using testing::IsEmpty;
using vclink::test::runAsUnprivilegedUser;
using vclink_host_tests::listElements;

namespace
{

namespace fs = std::filesystem;
constexpr int endOfFile = std::char_traits<char>::eof();

class StandInFiles : public testing::Test
{
  protected:
    /// Whether each descriptor of this process that refers to the file is closed in a program
    /// that is started.
    std::vector<bool> closedOnExec(const std::string &name) const
    {
        std::vector<bool> closed;
        for (const auto &[descriptor, file] : vclink::test::openDescriptors())
        {
            if (file == folder.file(name))
                closed.push_back((::fcntl(descriptor, F_GETFD) & FD_CLOEXEC) != 0);
        }
        return closed;
    }

    const vclink_host_tests::Folder folder{};
    const ustring where = utf8_to_ustring(folder.path().string());
};

using StandInFileStreams = StandInFiles;
using StandInFileOperations = StandInFiles;
using StandInTemporaryName = StandInFiles;

TEST_F(StandInFileStreams, AreNotInheritedByChildProcessesAndCloseTheirFile)
{
    basic_ofstream<char> out(folder.ufile("data"));
    EXPECT_THAT(closedOnExec("data"), ElementsAre(true));
    out.close();
    EXPECT_THAT(closedOnExec("data"), IsEmpty());
    basic_ifstream<char> in(folder.ufile("data"));
    EXPECT_THAT(closedOnExec("data"), ElementsAre(true));
    in.close();
    EXPECT_THAT(closedOnExec("data"), IsEmpty());
    basic_ofstream<char>(folder.ufile("data")) << "text";
    EXPECT_THAT(closedOnExec("data"), IsEmpty());
    EXPECT_EQ(folder.read("data"), "text");
}

TEST_F(StandInFileStreams, ReportWhatCouldNotBeWrittenWhenTheyClose)
{
    basic_ofstream<char> out(u"/dev/full");
    ASSERT_TRUE(out.is_open());
    out << "text";
    EXPECT_TRUE(out.good());
    out.close();
    EXPECT_TRUE(out.fail());
    EXPECT_FALSE(out.is_open());
}

TEST_F(StandInFileStreams, FailWhenClosedTwice)
{
    basic_ofstream<char> out(folder.ufile("data"));
    out.close();
    EXPECT_TRUE(out.good());
    out.close();
    EXPECT_TRUE(out.fail());
    basic_ifstream<char> in(folder.ufile("missing"));
    in.clear();
    in.close();
    EXPECT_TRUE(in.fail());
}

TEST_F(StandInFileStreams, KeepTheirStateWhenTheyCloseAndGiveNothingLater)
{
    folder.write("empty", "");
    basic_ifstream<char> empty(folder.ufile("empty"));
    EXPECT_EQ(empty.get(), endOfFile);
    empty.close();
    EXPECT_TRUE(empty.eof());
    folder.write("data", "text");
    basic_ifstream<char> in(folder.ufile("data"));
    in.close();
    EXPECT_EQ(in.get(), endOfFile);
    EXPECT_TRUE(in.eof());
}

TEST_F(StandInFileStreams, AppendStartAtTheEndAndMoveToAPlaceWhenAsked)
{
    folder.write("data", "0123");
    basic_ofstream<char>(folder.ufile("data"), std::ios_base::app) << "456789";
    EXPECT_EQ(folder.read("data"), "0123456789");
    basic_ifstream<char> atEnd(folder.ufile("data"), std::ios_base::in | std::ios_base::ate);
    EXPECT_EQ(atEnd.get(), endOfFile);
    basic_ifstream<char> in(folder.ufile("data"), std::ios_base::in | std::ios_base::binary);
    in.seekg(4);
    EXPECT_EQ(in.get(), '4');
    EXPECT_EQ(in.tellg(), std::streampos(5));
}

TEST_F(StandInFileStreams, FollowNoLink)
{
    folder.write("data", "text");
    fs::create_symlink("data", folder / "link");
    fs::create_symlink("missing", folder / "dangling");
    EXPECT_FALSE(basic_ifstream<char>(folder.ufile("link")).is_open());
    for (const std::string name : {"link", "dangling"})
    {
        for (const auto mode :
             {std::ios_base::out, std::ios_base::app, std::ios_base::in | std::ios_base::out})
            EXPECT_FALSE(basic_ofstream<char>(folder.ufile(name), mode).is_open()) << name;
    }
    EXPECT_EQ(folder.read("data"), "text");
    EXPECT_FALSE(fs::exists(folder / "missing"));
}

TEST_F(StandInFileStreams, OpenNamesThatAreNotUtf8)
{
    basic_ofstream<char>(folder.ufile("caf\xE9")) << "text";
    EXPECT_EQ(folder.read("caf\xE9"), "text");
}

TEST_F(StandInFiles, AreNoneUnderANameWithANul)
{
    folder.write("data", "text");
    const ustring name = folder.ufile("data") + ustring(1, u'\0') + u"x";
    EXPECT_FALSE(basic_ifstream<char>(name).is_open());
    EXPECT_FALSE(basic_ofstream<char>(name).is_open());
    EXPECT_FALSE(fl::filesystem::exists(upath(name)));
    EXPECT_FALSE(fl::filesystem::remove(upath(name)));
    EXPECT_EQ(folder.read("data"), "text");
}

TEST_F(StandInFileOperations, FollowLinksWhenTheyLookAndRemoveTheLinkItself)
{
    folder.write("target", "");
    fs::create_symlink("target", folder / "link");
    fs::create_symlink("missing", folder / "dangling");
    EXPECT_TRUE(fl::filesystem::exists(folder("link")));
    EXPECT_FALSE(fl::filesystem::exists(folder("dangling")));
    EXPECT_TRUE(fl::filesystem::remove(folder("dangling")));
    EXPECT_TRUE(fl::filesystem::remove(folder("link")));
    EXPECT_TRUE(fl::filesystem::exists(folder("target")));
    EXPECT_FALSE(fl::filesystem::remove(folder("link")));
}

TEST_F(StandInFileOperations, RemoveAnEmptyFolder)
{
    fs::create_directory(folder / "empty");
    EXPECT_TRUE(fl::filesystem::remove(folder("empty")));
    EXPECT_FALSE(fs::exists(folder / "empty"));
}

TEST_F(StandInFileOperations, RaiseWhenExistenceCannotBeFoundOut)
{
    fs::permissions(folder.path(), fs::perms::none);
    const auto look = [this]() -> std::string
    {
        try
        {
            return fl::filesystem::exists(folder("file")) ? "exists" : "is missing";
        }
        catch (const boost::filesystem::filesystem_error &error)
        {
            return error.code().message();
        }
    };
    EXPECT_EQ(runAsUnprivilegedUser(look), "Permission denied");
}

TEST_F(StandInTemporaryName, CreatesAnEmptyFileForItsOwnerAlone)
{
    const fs::path name = ustring_to_utf8(fl::filesystem::tmpnam(where, u"merge", u"txt"));
    const fs::file_status status = fs::symlink_status(name);
    EXPECT_TRUE(fs::is_regular_file(status)) << name;
    EXPECT_EQ(status.permissions(), fs::perms::owner_read | fs::perms::owner_write);
    EXPECT_EQ(fs::file_size(name), 0U);
    EXPECT_THAT(closedOnExec(name.filename()), IsEmpty());
}

TEST_F(StandInTemporaryName, HasTheFolderPrefixAndExtensionThatWereAskedFor)
{
    for (const ustring &extension : {ustring(u".txt"), ustring(u"txt")})
    {
        const ustring name = fl::filesystem::tmpnam(where, u"merge-", extension);
        // 128 bits in between, which nobody guesses.
        EXPECT_THAT(ustring_to_utf8(name),
                    testing::MatchesRegex(folder.file("merge-") + ".{32}\\.txt"));
    }
}

TEST_F(StandInTemporaryName, ComesBackAlsoWhenTheFolderIsMissingOrCannotBeWritten)
{
    fs::permissions(folder.path(), fs::perms(0555));
    for (const ustring &asked : {where, folder.ufile("missing")})
    {
        const auto problem = runAsUnprivilegedUser(
            [&asked]() -> std::string
            {
                const ustring one = fl::filesystem::tmpnam(asked, u"", u"");
                const bool isOther = one != fl::filesystem::tmpnam(asked, u"", u"");
                const bool isThere = one.compare(0, asked.size() + 1, asked + u"/") == 0;
                return isOther && isThere && !fl::filesystem::exists(upath(one)) ? "" : "wrong";
            });
        EXPECT_EQ(problem, "") << to_string(asked);
    }
    EXPECT_TRUE(fs::is_empty(folder.path()));
}

TEST(StandInPathText, TakesARunOfSlashesAsOne)
{
    using Elements = std::vector<ustring>;
    EXPECT_EQ(fl::filesystem::detail::get_root_path_length(u"//a"), 2U);
    EXPECT_EQ(listElements(u"///"), Elements({u"/"}));
    EXPECT_EQ(listElements(u"//a///b//"), Elements({u"/", u"a", u"b"}));
    EXPECT_EQ(listElements(u"a//"), Elements({u"a"}));
}

TEST(StandInPathText, JoinsWithOneSeparatorAlsoWhenBothSidesBringOne)
{
    for (ustring path : {u"/root/", u"/root"})
    {
        fl::filesystem::detail::concatenate_pathname(path, u"/a", true);
        EXPECT_EQ(path, u"/root/a");
    }
}

TEST(StandInPathText, FindsTheExtensionOfTheLastElement)
{
    const struct
    {
        const char16_t *path;
        const char16_t *extension;
        const char16_t *replaced;
    } rows[] = {
        {u"tool", u"sh", u"tool.sh"},
        {u"tool.exe", u"", u"tool"},
        {u".profile", u".sh", u".profile.sh"},
        {u"a/.profile", u"", u"a/.profile"},
        {u"a.b/", u".c", u"a.c/"},
        {u"a/..", u".c", u"a/...c"},
        {u"", u".c", u""},
        {u"/", u".c", u"/"},
        {u"tool.", u".c", u"tool.c"},
    };
    for (const auto &row : rows)
    {
        ustring path = row.path;
        fl::filesystem::detail::replace_extension(path, row.extension);
        EXPECT_EQ(path, row.replaced) << to_string(row.path);
    }
}

TEST(StandInPathText, KeepsABackslash)
{
    EXPECT_EQ(fl::filesystem::detail::make_generic_form(u"/a\\b"), u"/a\\b");
    EXPECT_EQ(fl::filesystem::detail::make_native_form(u"/a\\b", false), u"/a\\b");
    EXPECT_EQ(fl::filesystem::detail::make_native_access_form(u"/a\\b"), u"/a\\b");
}

} // namespace
