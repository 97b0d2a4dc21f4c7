// SPDX-License-Identifier: MIT
#include <set>
#include <string>

#include <gtest/gtest.h>
#include <sys/stat.h>
#include <unistd.h>

#include "fl/filesystem/operations.hpp"
#include "fl/i18n/convert.hpp"
#include "support/TemporaryFolder.hpp"

using fl::i18n::ustring_to_utf8;
using vclink_host_tests::ScopedVariable;
using vclink_host_tests::TemporaryFolder;
using vclink_host_tests::writeFile;

TEST(FileOperations, TellWhetherSomethingExists)
{
    const TemporaryFolder folder;
    writeFile(folder.file("file"), "");
    EXPECT_TRUE(fl::filesystem::exists(upath(folder.ufile("file"))));
    EXPECT_TRUE(fl::filesystem::exists(upath(folder.ufile(""))));
    EXPECT_FALSE(fl::filesystem::exists(upath(folder.ufile("missing"))));
    EXPECT_FALSE(fl::filesystem::exists(upath(folder.ufile("file/below"))));
}

TEST(FileOperations, RemoveAFile)
{
    const TemporaryFolder folder;
    writeFile(folder.file("file"), "");
    EXPECT_TRUE(fl::filesystem::remove(upath(folder.ufile("file"))));
    EXPECT_FALSE(fl::filesystem::exists(upath(folder.ufile("file"))));
}

TEST(FileOperations, RaiseWhenSomethingCannotBeRemoved)
{
    const TemporaryFolder folder;
    ASSERT_EQ(::mkdir(folder.file("full").c_str(), 0700), 0);
    writeFile(folder.file("full/file"), "");
    EXPECT_THROW(fl::filesystem::remove(upath(folder.ufile("full"))), std::exception);
    EXPECT_TRUE(fl::filesystem::exists(upath(folder.ufile("full/file"))));
}

TEST(FileOperations, NameTemporaryFilesInTheSystemsFolder)
{
    const TemporaryFolder folder;
    const ScopedVariable variable("TMPDIR", folder.path().c_str());
    const std::string name = ustring_to_utf8(fl::filesystem::tmpnam(u"", u"", u""));
    EXPECT_EQ(name.substr(0, name.rfind('/')), folder.path());
    EXPECT_GT(name.size(), folder.path().size() + 1);
}

TEST(FileOperations, NeverNameTwoTemporaryFilesAlike)
{
    const TemporaryFolder folder;
    const ScopedVariable variable("TMPDIR", folder.path().c_str());
    std::set<ustring> names;
    for (int round = 0; round < 200; ++round)
    {
        EXPECT_TRUE(names.insert(fl::filesystem::tmpnam(u"", u"", u"")).second);
    }
}

TEST(FileOperations, KnowWhereTheHostIsInstalled)
{
    const std::string path = ustring_to_utf8(fl::filesystem::get_install_path());
    ASSERT_FALSE(path.empty());
    EXPECT_EQ(path.front(), '/');
    struct stat status = {};
    EXPECT_EQ(::stat(path.c_str(), &status), 0) << path;
}
