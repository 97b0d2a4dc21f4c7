// SPDX-License-Identifier: MIT
#include <filesystem>
#include <fstream>
#include <string>

#include <gtest/gtest.h>

#include "support/TemporaryFolder.hpp"
#include "support/UnprivilegedUser.hpp"

namespace
{

namespace fs = std::filesystem;
using vclink::test::TemporaryFolder;

TEST(TemporaryFolder, IsEmptyAndOneOfItsOwnAndGoesWithAllItHolds)
{
    const TemporaryFolder other;
    fs::path path;
    {
        const TemporaryFolder folder;
        path = folder.path();
        EXPECT_TRUE(fs::is_empty(path));
        EXPECT_NE(path, other.path());
        EXPECT_EQ(folder / "name", path / "name");
        fs::create_directories(path / "a/b/c");
        std::ofstream(path / "a/b/file") << "text";
    }
    EXPECT_FALSE(fs::exists(path));
}

TEST(TemporaryFolder, KeepsWhatItsLinksPointTo)
{
    const TemporaryFolder other;
    fs::create_directory(other / "kept");
    fs::permissions(other / "kept", fs::perms::owner_read);
    {
        const TemporaryFolder folder;
        fs::create_directory_symlink(other / "kept", folder / "link");
    }
    ASSERT_TRUE(fs::is_directory(other / "kept"));
    EXPECT_EQ(fs::status(other / "kept").permissions(), fs::perms::owner_read);
}

TEST(TemporaryFolder, GoesAlsoWhenItHoldsFoldersThatCannotBeRead)
{
    const auto problem = vclink::test::runAsUnprivilegedUser(
        []() -> std::string
        {
            fs::path path;
            {
                const TemporaryFolder folder;
                path = folder.path();
                fs::create_directories(path / "closed/inner");
                fs::permissions(path / "closed/inner", fs::perms::none);
                fs::permissions(path / "closed", fs::perms::none);
            }
            return fs::exists(path) ? "it stays" : "";
        });
    EXPECT_EQ(problem, "");
}

} // namespace
