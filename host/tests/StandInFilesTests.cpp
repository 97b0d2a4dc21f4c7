// SPDX-License-Identifier: MIT
#include <iterator>
#include <string>

#include <boost/filesystem/directory.hpp>
#include <boost/filesystem/exception.hpp>
#include <boost/filesystem/operations.hpp>
#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/stat.h>
#include <unistd.h>

#include "fl/filesystem/detail/path_text.hpp"
#include "fl/filesystem/fstream.hpp"
#include "fl/filesystem/operations.hpp"
#include "fl/i18n/convert.hpp"
#include "support/ElementOrder.hpp"
#include "support/TemporaryFolder.hpp"

using fl::filesystem::basic_ifstream;
using fl::filesystem::basic_ofstream;
using fl::i18n::to_string;
using fl::i18n::ustring_to_utf8;
using fl::i18n::utf8_to_ustring;
using namespace vclink_host_tests;

namespace
{

/// The descriptors of this process that refer to the file.
std::vector<int> findDescriptors(const std::string &file)
{
    std::vector<int> found;
    for (const auto &entry : boost::filesystem::directory_iterator("/proc/self/fd"))
    {
        boost::system::error_code gone;
        if (boost::filesystem::read_symlink(entry.path(), gone) == file)
        {
            found.push_back(std::stoi(entry.path().filename().string()));
        }
    }
    return found;
}

bool isClosedOnExec(int descriptor)
{
    return (::fcntl(descriptor, F_GETFD) & FD_CLOEXEC) != 0;
}

std::string makeReal(const TemporaryFolder &folder, const std::string &name)
{
    return (boost::filesystem::canonical(folder.path()) / name).string();
}

} // namespace

TEST(StandInFileStreams, AreNotInheritedByChildProcesses)
{
    const TemporaryFolder folder;
    const std::string real = makeReal(folder, "data");
    basic_ofstream<char> out(folder.ufile("data"));
    auto descriptors = findDescriptors(real);
    ASSERT_EQ(descriptors.size(), 1U);
    EXPECT_TRUE(isClosedOnExec(descriptors.front()));
    out.close();
    EXPECT_TRUE(findDescriptors(real).empty());

    basic_ifstream<char> in(folder.ufile("data"));
    descriptors = findDescriptors(real);
    ASSERT_EQ(descriptors.size(), 1U);
    EXPECT_TRUE(isClosedOnExec(descriptors.front()));
    in.close();
    EXPECT_TRUE(findDescriptors(real).empty());
}

TEST(StandInFileStreams, CloseTheirFileAtTheirEnd)
{
    const TemporaryFolder folder;
    {
        basic_ofstream<char> out(folder.ufile("data"));
        out << "text";
    }
    EXPECT_TRUE(findDescriptors(makeReal(folder, "data")).empty());
    EXPECT_EQ(readFile(folder.file("data")), "text");
}

TEST(StandInFileStreams, ReportWhatCouldNotBeWrittenWhenTheyClose)
{
    basic_ofstream<char> out(u"/dev/full");
    ASSERT_TRUE(out.is_open());
    out << "text";
    EXPECT_TRUE(out.good());
    out.close();
    EXPECT_TRUE(out.fail());
    EXPECT_FALSE(out.is_open());
}

TEST(StandInFileStreams, FailWhenClosedTwice)
{
    const TemporaryFolder folder;
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

TEST(StandInFileStreams, KeepTheirStateWhenTheyClose)
{
    const TemporaryFolder folder;
    writeFile(folder.file("data"), "");
    basic_ifstream<char> in(folder.ufile("data"));
    EXPECT_EQ(in.get(), std::char_traits<char>::eof());
    in.close();
    EXPECT_TRUE(in.eof());
}

TEST(StandInFileStreams, GiveNothingAfterTheyWereClosed)
{
    const TemporaryFolder folder;
    writeFile(folder.file("data"), "text");
    basic_ifstream<char> in(folder.ufile("data"));
    in.close();
    EXPECT_EQ(in.get(), std::char_traits<char>::eof());
    EXPECT_TRUE(in.eof());
}

TEST(StandInFileStreams, AppendAndStartAtTheEndWhenAsked)
{
    const TemporaryFolder folder;
    writeFile(folder.file("data"), "one ");
    {
        basic_ofstream<char> out(folder.ufile("data"), std::ios_base::app);
        out << "two";
    }
    EXPECT_EQ(readFile(folder.file("data")), "one two");
    basic_ifstream<char> in(folder.ufile("data"), std::ios_base::in | std::ios_base::ate);
    EXPECT_EQ(in.get(), std::char_traits<char>::eof());
}

TEST(StandInFileStreams, FollowNoLink)
{
    const TemporaryFolder folder;
    writeFile(folder.file("data"), "text");
    ASSERT_EQ(::symlink("data", folder.file("link").c_str()), 0);
    ASSERT_EQ(::symlink("missing", folder.file("dangling").c_str()), 0);
    EXPECT_FALSE(basic_ifstream<char>(folder.ufile("link")).is_open());
    for (const std::string name : {"link", "dangling"})
    {
        for (const auto mode :
             {std::ios_base::out, std::ios_base::app, std::ios_base::in | std::ios_base::out})
        {
            EXPECT_FALSE(basic_ofstream<char>(folder.ufile(name), mode).is_open()) << name;
        }
    }
    EXPECT_EQ(readFile(folder.file("data")), "text");
    EXPECT_FALSE(fl::filesystem::exists(upath(folder.ufile("missing"))));
}

TEST(StandInFileStreams, MoveToAPlaceInTheFile)
{
    const TemporaryFolder folder;
    writeFile(folder.file("data"), "0123456789");
    basic_ifstream<char> in(folder.ufile("data"), std::ios_base::in | std::ios_base::binary);
    in.seekg(4);
    EXPECT_EQ(in.get(), '4');
    EXPECT_EQ(in.tellg(), std::streampos(5));
}

TEST(StandInFileStreams, OpenNamesThatAreNotUtf8)
{
    const TemporaryFolder folder;
    const std::string name = "caf\xE9";
    {
        basic_ofstream<char> out(folder.ufile(name));
        out << "text";
    }
    EXPECT_EQ(readFile(folder.file(name)), "text");
}

TEST(StandInFileStreams, HaveNoFileUnderANameWithANul)
{
    const TemporaryFolder folder;
    writeFile(folder.file("data"), "text");
    const ustring name = folder.ufile("data") + ustring(1, u'\0') + u"x";
    EXPECT_FALSE(basic_ifstream<char>(name).is_open());
    EXPECT_FALSE(basic_ofstream<char>(name).is_open());
    EXPECT_EQ(readFile(folder.file("data")), "text");
}

TEST(StandInFileOperations, FollowLinksWhenTheyLookAndRemoveTheLinkItself)
{
    const TemporaryFolder folder;
    writeFile(folder.file("target"), "");
    ASSERT_EQ(::symlink("target", folder.file("link").c_str()), 0);
    ASSERT_EQ(::symlink("missing", folder.file("dangling").c_str()), 0);
    EXPECT_TRUE(fl::filesystem::exists(upath(folder.ufile("link"))));
    EXPECT_FALSE(fl::filesystem::exists(upath(folder.ufile("dangling"))));
    EXPECT_TRUE(fl::filesystem::remove(upath(folder.ufile("dangling"))));
    EXPECT_TRUE(fl::filesystem::remove(upath(folder.ufile("link"))));
    EXPECT_TRUE(fl::filesystem::exists(upath(folder.ufile("target"))));
    EXPECT_FALSE(fl::filesystem::remove(upath(folder.ufile("link"))));
}

TEST(StandInFileOperations, RemoveAnEmptyFolder)
{
    const TemporaryFolder folder;
    ASSERT_EQ(::mkdir(folder.file("empty").c_str(), 0700), 0);
    EXPECT_TRUE(fl::filesystem::remove(upath(folder.ufile("empty"))));
    EXPECT_FALSE(fl::filesystem::exists(upath(folder.ufile("empty"))));
}

TEST(StandInFileOperations, KnowNothingUnderANameWithANul)
{
    const TemporaryFolder folder;
    writeFile(folder.file("data"), "text");
    const upath name(folder.ufile("data") + ustring(1, u'\0') + u"x");
    EXPECT_FALSE(fl::filesystem::exists(name));
    EXPECT_FALSE(fl::filesystem::remove(name));
    EXPECT_EQ(readFile(folder.file("data")), "text");
}

TEST(StandInFileOperations, RaiseWhenExistenceCannotBeFoundOut)
{
    const TemporaryFolder folder;
    ASSERT_EQ(::chmod(folder.path().c_str(), 0000), 0);
    const upath file(folder.ufile("file"));
    EXPECT_TRUE(checkAsUnprivilegedUser(
        [&file]
        {
            try
            {
                fl::filesystem::exists(file);
            }
            catch (const boost::filesystem::filesystem_error &error)
            {
                return error.code().value() == EACCES;
            }
            return false;
        }));
}

TEST(StandInTemporaryName, CreatesAnEmptyFileForItsOwnerAlone)
{
    const TemporaryFolder folder;
    const ustring where = utf8_to_ustring(folder.path());
    const std::string name = ustring_to_utf8(fl::filesystem::tmpnam(where, u"merge", u"txt"));
    struct stat status = {};
    ASSERT_EQ(::lstat(name.c_str(), &status), 0) << name;
    EXPECT_TRUE(S_ISREG(status.st_mode));
    EXPECT_EQ(status.st_mode & 07777U, 0600U);
    EXPECT_EQ(status.st_size, 0);
    EXPECT_TRUE(findDescriptors(makeReal(folder, name.substr(name.rfind('/') + 1))).empty());
}

TEST(StandInTemporaryName, HasTheFolderPrefixAndExtensionThatWereAskedFor)
{
    const TemporaryFolder folder;
    const ustring where = utf8_to_ustring(folder.path());
    for (const ustring &extension : {ustring(u".txt"), ustring(u"txt")})
    {
        const ustring name = fl::filesystem::tmpnam(where, u"merge-", extension);
        EXPECT_EQ(name.compare(0, where.size() + 7, where + u"/merge-"), 0) << to_string(name);
        EXPECT_EQ(name.substr(name.size() - 4), u".txt") << to_string(name);
        // 128 bits in between, which nobody guesses.
        EXPECT_EQ(name.size(), where.size() + 7 + 32 + 4) << to_string(name);
    }
}

TEST(StandInTemporaryName, ComesBackAlsoWhenTheFolderCannotBeWritten)
{
    const TemporaryFolder folder;
    ASSERT_EQ(::chmod(folder.path().c_str(), 0555), 0);
    const ustring where = utf8_to_ustring(folder.path());
    EXPECT_TRUE(checkAsUnprivilegedUser(
        [&where]
        {
            const ustring one = fl::filesystem::tmpnam(where, u"", u"");
            const ustring other = fl::filesystem::tmpnam(where, u"", u"");
            return one != other && one.compare(0, where.size(), where) == 0 &&
                   !fl::filesystem::exists(upath(one));
        }));
    EXPECT_TRUE(boost::filesystem::is_empty(folder.path()));
}

TEST(StandInTemporaryName, ComesBackAlsoWhenThereIsNoFolder)
{
    const TemporaryFolder folder;
    const ustring name = fl::filesystem::tmpnam(folder.ufile("missing"), u"", u"");
    EXPECT_EQ(name.compare(0, folder.ufile("missing/").size(), folder.ufile("missing/")), 0);
    EXPECT_FALSE(fl::filesystem::exists(upath(name)));
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
    ustring path = u"/root/";
    fl::filesystem::detail::concatenate_pathname(path, u"/a", true);
    EXPECT_EQ(path, u"/root/a");
    path = u"/root";
    fl::filesystem::detail::concatenate_pathname(path, u"/a", true);
    EXPECT_EQ(path, u"/root/a");
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
