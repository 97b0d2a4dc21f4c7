// SPDX-License-Identifier: MIT
#include "main/checkout/RemadeFiles.hpp"

#include <filesystem>
#include <string>

#include <git2/errors.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/stat.h>

#include "ObstacleFixture.hpp"
#include "support/UnprivilegedUser.hpp"
#include "support/text.hpp"

namespace
{

namespace fs = std::filesystem;
using testing::IsEmpty;
using namespace vclink::test;

/// Files of the working copy that have a further name, for example in a copy of it that was made of
/// hard links.
class HardLinks : public ObstacleFixture
{
  protected:
    HardLinks()
    {
        fs::create_directory(outside_);
    }
    void linkOutside(const std::string &name) const
    {
        fs::create_hard_link(repository_ / name, outside_ / name);
    }
    std::string readOutside(const std::string &name) const
    {
        return repository_.read("../backup/" + name);
    }

    const fs::path outside_ = folder() / "backup";
};

TEST_F(HardLinks, KeepTheirContentInASwitch)
{
    makeBranch("topic", writes("file", "theirs\n"));
    linkOutside("file");
    const std::string before = readOutside("file");
    branches().switchBranch("topic");
    EXPECT_EQ(repository_.read("file"), "theirs\n");
    EXPECT_EQ(readOutside("file"), before);
    EXPECT_THAT(status(), IsEmpty());
}

TEST_F(HardLinks, KeepTheirContentInAFastForward)
{
    makeBranch("topic", writes("file", "theirs\n"));
    linkOutside("file");
    const std::string before = readOutside("file");
    merge("topic");
    EXPECT_EQ(repository_.read("file"), "theirs\n");
    EXPECT_EQ(readOutside("file"), before);
}

TEST_F(HardLinks, KeepTheirContentInAMerge)
{
    diverge(writes("ours", "x"), writes("file", "theirs\n"));
    linkOutside("file");
    const std::string before = readOutside("file");
    merge("topic");
    EXPECT_EQ(repository_.read("file"), "theirs\n");
    EXPECT_EQ(readOutside("file"), before);
}

/// The merge's commit would take a change that nobody has made.
TEST_F(HardLinks, WithinTheWorkingCopyKeepTheirContentInAMerge)
{
    repository_.commitAll(writes("d/g", "f\n"), "the same twice");
    diverge(writes("ours", "x"), writes("d/f", "theirs\n"));
    repository_.remove("d/g");
    fs::create_hard_link(repository_ / "d/f", repository_ / "d/g");
    merge("topic");
    EXPECT_EQ(repository_.read("d/g"), "f\n");
    EXPECT_EQ(repository_.git({"show", "HEAD:d/g"}), "f\n");
}

TEST_F(HardLinks, KeepTheirContentInARevert)
{
    linkOutside("file");
    const std::string committed = repository_.read("file");
    repository_.write("file", "mine\n");
    ASSERT_EQ(readOutside("file"), "mine\n");
    adapter_->revertFiles({asPath((repository_ / "file").string())});
    EXPECT_EQ(repository_.read("file"), committed);
    EXPECT_EQ(readOutside("file"), "mine\n");
}

TEST_F(HardLinks, AreLeftIfTheCheckoutIsRefused)
{
    makeBranch("topic", writes("file", "theirs\n") + writes("zz", "theirs\n"));
    linkOutside("file");
    repository_.write("zz", "mine\n");
    EXPECT_EQ(failureOf([this] { branches().switchBranch("topic"); }).code, GIT_ECONFLICT);
    EXPECT_TRUE(fs::equivalent(repository_ / "file", outside_ / "file"));
}

/// libgit2 could write to the file, though not make another.
TEST_F(HardLinks, InAFolderThatCannotBeWrittenToAreRefused)
{
    makeBranch("topic", writes("d/f", "theirs\n"));
    fs::create_hard_link(repository_ / "d/f", outside_ / "f");
    giveToUnprivilegedUser(folder().path());
    repository_.setMode("d", 0555);
    const std::string text = runAsUnprivilegedUser(
        [this] { return failureOf([this] { branches().switchBranch("topic"); }).text; });
    repository_.setMode("d", 0755);
    EXPECT_EQ(text, "the file 'd/f' has further names, and its folder cannot be written to");
    EXPECT_EQ(readOutside("f"), "f\n");
    EXPECT_EQ(repository_.read(".git/HEAD"), "ref: refs/heads/main\n");
}

} // namespace
