// SPDX-License-Identifier: MIT
#include "main/checkout/treeChanges.hpp"

#include <stdexcept>
#include <string>
#include <vector>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "main/branches/BranchFixture.hpp"
#include "support/text.hpp"
#include "util/repository/repository.hpp"

namespace
{

namespace git = vclink::git;
using testing::ElementsAre;
using testing::IsEmpty;
using namespace vclink::test;

/// What two trees differ in, compared with `git diff-tree`.
class TreeChanges : public BranchFixture
{
  protected:
    TreeChanges()
    {
        for (const auto *name :
             {"a", "b/one", "b/two", "b-c", "deep/er/and/deeper", "same/file", "tool", "z"})
            repository_.write(name, "x");
        repository_.commitAll("first");
    }

    /// "letter path", as git reports it without renames.
    std::vector<std::string> byGit(const std::string &before, const std::string &after) const
    {
        std::vector<std::string> lines = split(
            repository_.git({"diff-tree", "-r", "--no-renames", "--name-status", before, after}));
        for (auto &line : lines)
            line[1] = ' ';
        return lines;
    }
    std::vector<std::string> byLibrary(const std::string &before, const std::string &after) const
    {
        const auto repository = git::openRepository(asPath(repository_.path()));
        const auto left = treeOf(repository.get(), before);
        const auto right = treeOf(repository.get(), after);
        std::vector<std::string> lines;
        git::visitTreeChanges(repository.get(), left.get(), right.get(),
                              [&](const git::TreeChange &change)
                              {
                                  lines.push_back(letterOf(change) + (' ' + change.path));
                                  return true;
                              });
        return lines;
    }
    /// Expects what git reports, except type changes, for which git has its own letter.
    void expectAsGit(const std::string &before, const std::string &after) const
    {
        auto expected = byGit(before, after);
        for (auto &line : expected)
            line[0] = line[0] == 'T' ? 'M' : line[0];
        EXPECT_EQ(byLibrary(before, after), expected);
    }

  private:
    static git::OwnedHandle<git_tree> treeOf(git_repository *repository, const std::string &name)
    {
        if (name == "nothing")
            return nullptr;
        const auto object = git::revparseObject(repository, name + "^{tree}");
        return git::lookupTree(repository, git_object_id(object.value().get()));
    }
    static std::string letterOf(const git::TreeChange &change)
    {
        if (change.before == nullptr)
            return "A";
        return change.after == nullptr ? "D" : "M";
    }
};

TEST_F(TreeChanges, AreFilesAddedChangedAndRemovedAtEveryDepth)
{
    repository_.write("a", "changed");
    repository_.write("b/three", "x");
    repository_.remove("deep/er/and/deeper");
    repository_.write("deep/other", "x");
    repository_.write("new/folder/file", "x");
    repository_.remove("z");
    repository_.commitAll("second");
    expectAsGit("HEAD~1", "HEAD");
    expectAsGit("HEAD", "HEAD~1");
    EXPECT_THAT(byLibrary("HEAD~1", "HEAD"),
                ElementsAre("M a", "A b/three", "D deep/er/and/deeper", "A deep/other",
                            "A new/folder/file", "D z"));
}

TEST_F(TreeChanges, AreModesAndKinds)
{
    repository_.setMode("tool", 0755);
    repository_.commitAll(removes("z") + links("a", "z"), "second");
    expectAsGit("HEAD~1", "HEAD");
    EXPECT_THAT(byLibrary("HEAD~1", "HEAD"), ElementsAre("M tool", "M z"));
}

TEST_F(TreeChanges, AreAFileAndEachOfAFolderThatTakesItsPlace)
{
    repository_.remove("a");
    repository_.write("a/inside", "x");
    repository_.remove("b");
    repository_.write("b", "x");
    repository_.commitAll("second");
    EXPECT_THAT(byLibrary("HEAD~1", "HEAD"),
                ElementsAre("D a", "A a/inside", "A b", "D b/one", "D b/two"));
}

TEST_F(TreeChanges, AreSubmodulesAsAWhole)
{
    auto inner = makeRepository("inner");
    inner.commit("first");
    repository_.git({"submodule", "--quiet", "add", inner.path().string(), "module"});
    repository_.commitAll("second");
    expectAsGit("HEAD~1", "HEAD");
}

TEST_F(TreeChanges, FromAndToNothingAreEveryFile)
{
    EXPECT_THAT(byLibrary("nothing", "HEAD"), testing::SizeIs(8));
    EXPECT_THAT(byLibrary("HEAD", "nothing"), testing::SizeIs(8));
    EXPECT_THAT(byLibrary("nothing", "nothing"), IsEmpty());
    EXPECT_THAT(byLibrary("HEAD", "HEAD"), IsEmpty());
}

TEST_F(TreeChanges, EndWhenTheVisitorHasSeenEnough)
{
    const auto repository = git::openRepository(asPath(repository_.path()));
    const auto tree = git::lookupTree(
        repository.get(),
        git_object_id(git::revparseObject(repository.get(), "HEAD^{tree}").value().get()));
    int count = 0;
    git::visitTreeChanges(repository.get(), nullptr, tree.get(),
                          [&count](const git::TreeChange &) { return ++count < 2; });
    EXPECT_EQ(count, 2);
}

} // namespace
