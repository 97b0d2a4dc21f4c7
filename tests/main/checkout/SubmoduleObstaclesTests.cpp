// SPDX-License-Identifier: MIT
#include <memory>
#include <string>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "../TestOptionsFactory.hpp"
#include "ObstacleFixture.hpp"
#include "support/text.hpp"

namespace
{

namespace git = vclink::git;
using testing::ElementsAre;
using testing::IsEmpty;
using namespace vclink::test;

/// Switches, fast-forwards and merges between branches with and without the submodule "module".
class SubmoduleObstacles : public ObstacleFixture
{
  protected:
    /// "with" has the submodule, main does not, and its folder is left.
    void makeLeft()
    {
        makeBranch("with",
                   [this](const GitRepository &copy)
                   {
                       addModule();
                       copy.write("a first", "x");
                   });
        ASSERT_THAT(status(), ElementsAre("?? module/"));
    }
    /// The same, without the folder.
    void makeAdding()
    {
        makeLeft();
        repository_.remove("module");
    }
    /// main has the submodule, and "topic" something else in its place.
    void makeReplacing(const Change &replace)
    {
        addModule();
        makeBranch("topic", runsGit({"rm", "--quiet", "--force", "module"}) +
                                writes("a first", "x") + replace);
    }
    /// Makes a repository with one commit, without an entry in .gitmodules.
    static Change embeds(const std::string &name)
    {
        return [name](const GitRepository &copy)
        {
            auto embedded = GitRepository::init(copy / name);
            embedded.write("own", "x");
            embedded.commitAll("embedded");
        };
    }
    void populate() const
    {
        repository_.git({"submodule", "--quiet", "update", "--init"});
    }
    void switchTo(const std::string &name) const
    {
        branches().switchBranch(name);
        EXPECT_EQ(currentBranch(), "refs/heads/" + name);
    }
    void expectBothRefused(const Failure &failure, const std::string &branch) const
    {
        expectSwitchRefused(failure, branch);
        expectNothingChanges([&] { EXPECT_EQ(failureOfMerge(branch), textOf(failure)); });
    }

    const GitRepository module_{repository_ / "module"};
};

TEST_F(SubmoduleObstacles, AreNotFoldersOfSubmodulesThatGoAndComeBack)
{
    makeLeft();
    switchTo("with");
    EXPECT_THAT(status(), IsEmpty());
    module_.write("untracked", "mine\n");
    GitRepository(module_).commitAll("mine");
    const std::string mine = module_.line({"rev-parse", "HEAD"});
    switchTo("main");
    EXPECT_THAT(status(), ElementsAre("?? module/"));
    EXPECT_EQ(module_.line({"rev-parse", "HEAD"}), mine);
    switchTo("with");
    EXPECT_THAT(status(), ElementsAre(" M module"));
    EXPECT_EQ(module_.read("untracked"), "mine\n");
}

TEST_F(SubmoduleObstacles, AreNotFoldersWhereAFastForwardBringsASubmodule)
{
    makeLeft();
    merge("with");
    EXPECT_EQ(idOf("main"), idOf("with"));
    EXPECT_THAT(status(), IsEmpty());
}

TEST_F(SubmoduleObstacles, AreNotIgnoredFoldersWhereASubmoduleComes)
{
    makeAdding();
    repository_.write(".git/info/exclude", "/module\n");
    repository_.write("module/precious", "mine\n");
    switchTo("with");
    EXPECT_EQ(repository_.read("module/precious"), "mine\n");
    EXPECT_EQ(idOf("with:module"), repository_.line({"rev-parse", ":module"}));
}

TEST_F(SubmoduleObstacles, AreNotFilesInThePlaceOfASubmoduleThatGoes)
{
    makeLeft();
    switchTo("with");
    repository_.remove("module");
    repository_.write("module", "mine\n");
    switchTo("main");
    EXPECT_EQ(repository_.read("module"), "mine\n");
    EXPECT_THAT(status(), ElementsAre("?? module"));
}

TEST_F(SubmoduleObstacles, AreFilesAndLinksWhereASubmoduleComes)
{
    makeAdding();
    repository_.write(".git/info/exclude", "/module\n");
    repository_.write("module", "mine\n");
    expectBothRefused(inTheWay("untracked file 'module'"), "with");
    repository_.remove("module");
    repository_.symlink("d", "module");
    expectBothRefused(inTheWay("symbolic link 'module'"), "with");
    repository_.remove("module");
    makeFifo(repository_ / "module");
    expectBothRefused(inTheWay("FIFO, socket or device 'module'"), "with");
    repository_.commitAll(removes("module") + writes("ours", "x"), "on main");
    repository_.write("module", "mine\n");
    expectNothingChanges(
        [this] { EXPECT_EQ(failureOfMerge("with"), textOf(inTheWay("untracked file 'module'"))); });
}

TEST_F(SubmoduleObstacles, AreFoldersInThePlaceOfAFileThatBecomesASubmodule)
{
    makeBranch("topic", writes("a first", "x") + removes("other") + embeds("other"));
    repository_.git({"checkout", "--quiet", "--force", "main"});
    repository_.remove("other");
    repository_.write("other/precious", "mine\n");
    expectBothRefused(inTheWay("folder 'other'"), "topic");
    repository_.remove("other");
    // A file that is only missing is in nobody's way.
    switchTo("topic");
    EXPECT_THAT(status(), IsEmpty());
}

TEST_F(SubmoduleObstacles, AreMissingFoldersThatBecomeASubmodule)
{
    makeBranch("topic", runsGit({"rm", "-r", "--quiet", "d"}) + embeds("d"));
    ASSERT_EQ(repository_.line({"cat-file", "-t", "main:d"}), "tree");
    ASSERT_NE(repository_.line({"ls-tree", "topic", "d"}).find("commit"), std::string::npos);
    repository_.remove("d");
    expectBothRefused(
        refusal("the folder 'd', which becomes a submodule, is missing: bring it back "
                "with 'git restore --source=HEAD --staged --worktree' first"),
        "topic");
}

TEST_F(SubmoduleObstacles, AreStagedFilesInAFolderThatBecomesASubmodule)
{
    makeAdding();
    repository_.write("module/staged", "mine\n");
    repository_.add({"module/staged"});
    expectBothRefused(staged("module/staged"), "with");
}

TEST_F(SubmoduleObstacles, AreNotMissingSubmodulesThatBecomeAFile)
{
    makeReplacing(writes("module", "theirs\n"));
    repository_.remove("module");
    switchTo("topic");
    EXPECT_EQ(repository_.read("module"), "theirs\n");
    EXPECT_THAT(status(), IsEmpty());
}

TEST_F(SubmoduleObstacles, AreNotMissingSubmodulesThatBecomeAFolder)
{
    makeReplacing(writes("module/a", "theirs\n"));
    repository_.remove("module");
    switchTo("topic");
    EXPECT_EQ(repository_.read("module/a"), "theirs\n");
    EXPECT_THAT(status(), IsEmpty());
}

TEST_F(SubmoduleObstacles, AreSubmodulesWithFilesThatBecomeAFolder)
{
    makeReplacing(writes("module/a", "theirs\n"));
    populate();
    expectBothRefused(inTheWay("folder 'module'"), "topic");
}

/// libgit2 takes the submodule for gone then, and its folder for a new one.
TEST_F(SubmoduleObstacles, OfAMergeAreNotFoldersThatOursHasMadeOfASubmodule)
{
    makeReplacing(writes("module", "theirs\n"));
    repository_.git({"rm", "--quiet", "--force", "module"});
    repository_.commitAll(writes("module/inside", "ours\n"), "a folder");
    expectConflicts("topic");
    EXPECT_EQ(repository_.read("module/inside"), "ours\n");
    EXPECT_EQ(repository_.git({"show", ":module/inside"}), "ours\n");
    EXPECT_EQ(repository_.git({"show", ":3:module"}), "theirs\n");
}

TEST_F(SubmoduleObstacles, OfAMergeAreFoldersBehindASiblingThatSortsBeforeThem)
{
    repository_.commitAll(writes("module-1", "x"), "a name that sorts before the folder's");
    makeReplacing(changesNothing);
    populate();
    repository_.commitAll(writes("ours", "x"), "on main");
    repository_.write("module/mine", "mine\n");
    expectMergeRefused(inTheWay("folder 'module'"));
    repository_.commitAll(removes("module-1"), "without it");
    merge("topic");
    EXPECT_EQ(parents().size(), 2U);
    EXPECT_EQ(repository_.read("module/mine"), "mine\n");
}

TEST_F(SubmoduleObstacles, OfAMergeAreFoldersThatBecomeAFileBehindASibling)
{
    repository_.commitAll(writes("module-1", "x"), "a name that sorts before the folder's");
    makeReplacing(writes("module", "theirs\n"));
    repository_.git({"submodule", "--quiet", "deinit", "--force", "module"});
    repository_.commitAll(writes("ours", "x"), "on main");
    expectMergeRefused(inTheWay("folder 'module'"));
}

/// The other side has something else in the place, which the merge base may have as a file.
TEST_F(SubmoduleObstacles, OfAMergeAreFoldersThatOnlyWeHaveBehindASibling)
{
    repository_.commitAll(writes("module-1", "x"), "a name that sorts before the folder's");
    for (const bool hasFileBefore : {false, true})
    {
        SCOPED_TRACE(hasFileBefore);
        if (hasFileBefore)
            repository_.write("module", "a file\n");
        repository_.commitAll("before");
        makeBranch("topic", writes("module", "theirs\n"));
        if (hasFileBefore)
            repository_.remove("module");
        repository_.commitAll(embeds("module"), "on main");
        repository_.write("module/mine", "mine\n");
        expectMergeRefused(inTheWay("folder 'module'"));
        repository_.git({"branch", "--quiet", "-D", "topic"});
        repository_.remove("module");
    }
}

TEST_F(SubmoduleObstacles, InConflictKeepTheirFolderIfTheyCannotBeMixed)
{
    repository_.commitAll(writes(".gitattributes", "* -merge\n"), "attributes");
    diverge(embeds("module"), writes("module", "theirs\n") +
                                  writes("module-1", "a name that sorts before the folder's"));
    repository_.write("module/mine", "mine\n");
    expectConflicts("topic");
    EXPECT_EQ(repository_.read("module/mine"), "mine\n");
    EXPECT_EQ(module_.line({"log", "--format=%s"}), "embedded");
    EXPECT_THAT(conflicts(), ElementsAre("2 module", "3 module"));
}

TEST_F(SubmoduleObstacles, AreModulesFilesThatCannotBeRead)
{
    makeBranch("topic", writes("a first", "x") + embeds("module"));
    repository_.remove("module");
    repository_.write(".gitmodules", "broken [\n");
    const Failure failure{GIT_ERROR, GIT_ERROR_CONFIG,
                          "failed to parse config file: invalid configuration key (in " +
                              (repository_ / ".gitmodules").string() + ":1)"};
    expectBothRefused(failure, "topic");
    repository_.write("ours", "x");
    repository_.add({"ours"});
    repository_.git({"commit", "--quiet", "-m", "ours"});
    expectMergeRefused(failure);
    repository_.remove(".gitmodules");
    merge("topic");
    EXPECT_EQ(parents().size(), 2U);
}

TEST_F(SubmoduleObstacles, AreFilesThatAreStagedInThePlaceOfASubmodule)
{
    makeReplacing(changesNothing);
    repository_.git({"rm", "--quiet", "--cached", "module"});
    repository_.remove("module");
    repository_.write("module", "mine\n");
    repository_.add({"module"});
    expectSwitchRefused(staged("module"));
}

TEST_F(SubmoduleObstacles, AreStagedCommitsOfASubmodule)
{
    addModule();
    repository_.git({"checkout", "--quiet", "-b", "topic"});
    GitRepository(module_).commitAll("theirs");
    repository_.commitAll("on topic");
    repository_.git({"checkout", "--quiet", "main"});
    GitRepository module(module_);
    module.commitAll("more");
    repository_.add({"module"});
    expectBothRefused(staged("module"), "topic");
    repository_.git({"rm", "--quiet", "--cached", "module"});
    expectBothRefused(staged("module"), "topic");
}

/// A host's options factory may ask for force: libgit2 would delete the folders then.
TEST_F(SubmoduleObstacles, OfAForcedSwitchAreFoldersOfSubmodules)
{
    makeLeft();
    const auto factory = std::make_shared<vclink::test::TestOptionsFactory>(interactor_);
    factory->checkoutOptions.checkoutStrategy = GIT_CHECKOUT_FORCE;
    git::GitAdapter adapter(vclink::test::asPath(repository_.path()), factory);
    const auto expectForcedRefused = [&](const std::string &branch)
    {
        expectNothingChanges(
            [&]
            {
                EXPECT_EQ(vclink::test::failureOf(
                              [&] { git::BranchManager::create(adapter)->switchBranch(branch); }),
                          inTheWay("folder 'module'"));
            });
    };
    expectForcedRefused("with");
    switchTo("with");
    expectForcedRefused("main");
}

/// Its git_checkout_tree has no index to compare with.
TEST_F(SubmoduleObstacles, AreNotFoldersWhereASubmoduleComesWithoutAnIndex)
{
    makeLeft();
    for (const auto *name : {"file", "other", "d"})
        repository_.remove(name);
    repository_.remove(".git/index");
    switchTo("with");
    EXPECT_THAT(status(), IsEmpty());
}

} // namespace
