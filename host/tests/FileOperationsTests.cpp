// SPDX-License-Identifier: MIT
#include <filesystem>
#include <set>
#include <string>

#include <gtest/gtest.h>

#include "fl/filesystem/operations.hpp"
#include "support/Files.hpp"

using fl::i18n::ustring_to_utf8;
using vclink_host_tests::ScopedVariable;

namespace
{

class FileOperations : public testing::Test
{
  protected:
    const vclink_host_tests::Folder folder{};
};

TEST_F(FileOperations, TellWhetherSomethingExistsAndRemoveAFile)
{
    folder.write("file", "");
    EXPECT_TRUE(fl::filesystem::exists(folder("file")));
    EXPECT_TRUE(fl::filesystem::exists(folder("")));
    EXPECT_FALSE(fl::filesystem::exists(folder("missing")));
    EXPECT_FALSE(fl::filesystem::exists(folder("file/below")));
    EXPECT_TRUE(fl::filesystem::remove(folder("file")));
    EXPECT_FALSE(fl::filesystem::exists(folder("file")));
}

TEST_F(FileOperations, RaiseWhenSomethingCannotBeRemoved)
{
    std::filesystem::create_directory(folder / "full");
    folder.write("full/file", "");
    EXPECT_THROW(fl::filesystem::remove(folder("full")), std::exception);
    EXPECT_TRUE(fl::filesystem::exists(folder("full/file")));
}

TEST_F(FileOperations, NameTemporaryFilesInTheSystemsFolderAndNeverTwoAlike)
{
    const ScopedVariable variable("TMPDIR", folder.path().c_str());
    std::set<ustring> names;
    for (int round = 0; round < 200; ++round)
        EXPECT_TRUE(names.insert(fl::filesystem::tmpnam(u"", u"", u"")).second);
    const std::filesystem::path name = ustring_to_utf8(*names.begin());
    EXPECT_EQ(name.parent_path(), folder.path());
    EXPECT_NE(name.filename(), "");
}

TEST_F(FileOperations, KnowWhereTheHostIsInstalled)
{
    const std::filesystem::path path = ustring_to_utf8(fl::filesystem::get_install_path());
    EXPECT_TRUE(path.is_absolute());
    EXPECT_TRUE(std::filesystem::exists(path)) << path;
}

} // namespace
