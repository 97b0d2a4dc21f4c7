// SPDX-License-Identifier: MIT
#include <functional>
#include <memory>
#include <string>
#include <utility>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "MergeFixture.hpp"
#include "support/text.hpp"

namespace
{

using testing::ElementsAre;
using testing::IsEmpty;
using namespace vclink::test;

/// Merges of branches that have the submodule "module", whose repository has three commits.
class MergedSubmodules : public MergeFixture
{
  protected:
    MergedSubmodules()
    {
        auto inner = addModule();
        first_ = merged();
        inner.write("inner", "2\n");
        second_ = inner.commitAll("inner 2");
        inner.write("inner", "3\n");
        third_ = inner.commitAll("inner 3");
        module_.git({"fetch", "--quiet"});
    }

    /// Checks a commit out in the submodule.
    void go(const std::string &id) const
    {
        checksOut(id)(repository_);
    }
    static Change checksOut(const std::string &id)
    {
        return [id](const GitRepository &copy) {
            GitRepository(copy / "module").git({"checkout", "--quiet", id});
        };
    }
    /// "topic" moves the submodule to the second commit. Ours stays at the first, which is also
    /// checked out, and has another change.
    void theyMove(const Change &ours)
    {
        diverge(checksOut(first_) + ours, checksOut(second_));
    }
    /// The submodule's commit at HEAD; empty when it has none.
    std::string merged() const
    {
        return repository_.line({"ls-tree", "--format=%(objectname)", "HEAD", "module"});
    }
    /// "topic" takes the submodule out of the index and leaves its folder.
    void theyRemove(const Change &ours, const std::string &file = "theirs")
    {
        repository_.git({"checkout", "--quiet", "-b", "topic"});
        removes_(repository_);
        repository_.write(file, "theirs\n");
        repository_.add({file});
        repository_.commit("on topic");
        repository_.git({"checkout", "--quiet", "--force", "main"});
        repository_.commitAll(ours, "on main");
    }
    /// Goes to a branch from before the submodule, whose folder stays.
    void leaveSubmodule()
    {
        repository_.git({"checkout", "--quiet", "-b", "before", idOf("main~1")});
        repository_.write("ours", "x");
        repository_.add({"ours"});
        repository_.commit("on before");
    }
    /// Has the submodule removed on main and its folder left.
    void weRemove()
    {
        removes_(repository_);
        repository_.commit("on main");
        repository_.write(".git/info/exclude", "/module\n");
    }
    static CommandResult commitByGit(const GitRepository &repository)
    {
        return repository.tryGit({"commit", "--quiet", "--all", "--message", "merged"});
    }
    /// Commits as the library does, and as `git commit --all` does in a twin.
    void expectCommitAsGit() const
    {
        const GitRepository twin = makeTwin();
        EXPECT_TRUE(commitByGit(twin).succeeded());
        commit();
        EXPECT_EQ(idOf("HEAD^{tree}"), twin.line({"rev-parse", "HEAD^{tree}"}));
        EXPECT_THAT(parents(), testing::SizeIs(2));
    }
    void expectAsGitBesideTheFolder() const
    {
        const auto expected = outcomeByGit("topic");
        const auto outcome = outcomeByLibrary("topic");
        EXPECT_EQ(outcome.index, expected.index);
        EXPECT_EQ(outcome.tree, expected.tree);
        EXPECT_EQ(outcome.parents, expected.parents);
        EXPECT_EQ(outcome.mergeHead, expected.mergeHead);
    }
    void commit() const
    {
        adapter_->commit(upath(), ustring(u"merged"));
    }

    const Change removes_ = runsGit({"rm", "--quiet", "--cached", "module", ".gitmodules"});
    const GitRepository module_{repository_ / "module"};
    std::string first_;
    std::string second_;
    std::string third_;
};

TEST_F(MergedSubmodules, TakeTheCommitOfTheSideThatMovedThemAndNotWhatIsCheckedOut)
{
    theyMove(writes("ours", "x"));
    ASSERT_EQ(idOf("main:module"), first_);
    ASSERT_EQ(idOf("topic:module"), second_);
    const std::string ours = idOf("main");
    for (const std::string &id : {first_, third_})
    {
        go(id);
        expectAsGitBesideTheFolder();
        EXPECT_EQ(merged(), second_);
        EXPECT_EQ(module_.line({"rev-parse", "HEAD"}), id) << "what is checked out stays";
        EXPECT_THAT(status(), ElementsAre(" M module"));
        // The user's choice is the next commit's.
        commit();
        EXPECT_EQ(merged(), id);
        repository_.git({"reset", "--quiet", "--hard", ours});
    }
}

TEST_F(MergedSubmodules, KeepTheCommitThatOursMovedThemTo)
{
    diverge(checksOut(third_), writes("theirs", "x"));
    go(second_);
    expectAsGitBesideTheFolder();
    EXPECT_EQ(merged(), third_) << "not what is checked out";
}

TEST_F(MergedSubmodules, InACommitByHandStayAsMergedUnlessTheUserHasMovedOrRemovedThem)
{
    makeBranch("topic", checksOut(second_) + writes("file", "theirs\n"));
    go(first_);
    repository_.commitAll(writes("file", "ours\n"), "on main");
    const std::vector<std::pair<Change, std::string>> changes{
        {changesNothing, second_}, {checksOut(third_), third_}, {removes("module"), ""}};
    for (const auto &[change, id] : changes)
    {
        expectConflicts("topic");
        repository_.write("file", "both\n");
        change(repository_);
        commit();
        EXPECT_EQ(merged(), id);
        EXPECT_THAT(parents(), testing::SizeIs(2));
        repository_.git({"reset", "--quiet", "--hard", "main@{1}"});
    }
}

TEST_F(MergedSubmodules, OfAMergeByGitStayAsMergedInACommit)
{
    theyMove(writes("ours", "x"));
    repository_.git({"merge", "--quiet", "--no-commit", "topic"});
    commit();
    EXPECT_EQ(merged(), second_);
}

TEST_F(MergedSubmodules, InConflictAreTakenAsTheyAreCheckedOut)
{
    diverge(
        checksOut(third_), checksOut(second_) + [this](const GitRepository &)
                               { GitRepository(module_).commitAll("theirs"); });
    for (const std::string &id : {third_, first_})
    {
        go(third_);
        expectAsGitBesideTheFolder();
        EXPECT_THAT(conflicts(), ElementsAre("1 module", "2 module", "3 module"));
        go(id);
        commit();
        EXPECT_EQ(merged(), id);
        EXPECT_THAT(status(), IsEmpty());
        repository_.git({"reset", "--quiet", "--hard", "main@{1}"});
    }
}

TEST_F(MergedSubmodules, InConflictThatAreNotPopulatedStayOurs)
{
    diverge(checksOut(third_), checksOut(second_));
    repository_.git({"submodule", "--quiet", "deinit", "--force", "module"});
    expectConflicts("topic");
    commit();
    EXPECT_EQ(merged(), third_);
}

TEST_F(MergedSubmodules, ThatTheyRemovedLeaveTheIndexAndStayOnDisk)
{
    module_.write("untracked", "mine\n");
    theyRemove(writes("ours", "x"));
    expectAsGitBesideTheFolder();
    EXPECT_EQ(merged(), "");
    EXPECT_EQ(module_.read("untracked"), "mine\n");
    EXPECT_EQ(module_.line({"rev-parse", "HEAD"}), first_);
}

TEST_F(MergedSubmodules, ThatTheyRemovedAreGoneBesideConflictsToo)
{
    theyRemove(writes("file", "ours\n"), "file");
    expectAsGitBesideTheFolder();
    EXPECT_THAT(conflicts(), ElementsAre("1 file", "2 file", "3 file"));
    EXPECT_EQ(repository_.line({"ls-files", "module"}), "");
    repository_.write("file", "both\n");
    commit();
    EXPECT_EQ(merged(), "");
}

TEST_F(MergedSubmodules, ThatTheyRemovedAndWeMovedAreInConflict)
{
    theyRemove(checksOut(third_));
    expectAsGitBesideTheFolder();
    EXPECT_THAT(conflicts(), ElementsAre("1 module", "2 module"));
}

/// As in a clone of git, where `git rm` has left the folder of a submodule with edits.
TEST_F(MergedSubmodules, ThatWeRemovedAndTheyMovedAreTakenAsTheyAreCheckedOutOrStayRemoved)
{
    makeBranch("topic", checksOut(second_));
    weRemove();
    expectAsGitBesideTheFolder();
    EXPECT_THAT(conflicts(), ElementsAre("1 module", "3 module"));
    for (const std::string &id : {first_, second_, third_})
    {
        go(id);
        expectCommitAsGit();
        EXPECT_EQ(merged(), id);
        repository_.git({"reset", "--quiet", "--hard", "main@{1}"});
        expectConflicts("topic");
    }
    repository_.remove("module");
    expectCommitAsGit();
    EXPECT_EQ(merged(), "");
}

/// git commits nothing then: it has no commit to take.
TEST_F(MergedSubmodules, ThatWeRemovedAndTheyMovedStayRemovedWithoutARepository)
{
    makeBranch("topic", checksOut(second_));
    weRemove();
    expectConflicts("topic");
    repository_.remove("module");
    repository_.write("module/mine", "mine\n");
    EXPECT_FALSE(commitByGit(makeTwin()).succeeded());
    commit();
    EXPECT_EQ(merged(), "");
    EXPECT_EQ(repository_.read("module/mine"), "mine\n");
}

/// All that they did; a later commit must not take the merge for one that was interrupted.
TEST_F(MergedSubmodules, MayBeAllThatTheyRemoved)
{
    repository_.git({"checkout", "--quiet", "-b", "topic"});
    repository_.git({"rm", "--quiet", "--cached", "module"});
    repository_.commit("on topic");
    repository_.git({"checkout", "--quiet", "--force", "main"});
    repository_.commitAll(writes("ours", "x"), "on main");
    expectAsGitBesideTheFolder();
}

TEST_F(MergedSubmodules, ComeToTheFolderThatABranchHasLeft)
{
    repository_.git({"checkout", "--quiet", "-b", "topic"});
    go(second_);
    repository_.commitAll("on topic");
    leaveSubmodule();
    module_.write("untracked", "mine\n");
    ASSERT_THAT(status(), ElementsAre("?? module/"));
    expectAsGitBesideTheFolder();
    EXPECT_EQ(merged(), second_);
    EXPECT_EQ(module_.read("untracked"), "mine\n");
}

/// It is unknown which commit is checked out in it.
TEST_F(MergedSubmodules, ComeToARepositoryWithoutACommit)
{
    repository_.git({"branch", "topic"});
    leaveSubmodule();
    repository_.remove("module");
    const auto empty = GitRepository::init(repository_ / "module");
    empty.write("untracked", "mine\n");
    expectAsGitBesideTheFolder();
    EXPECT_EQ(merged(), first_);
    EXPECT_EQ(empty.read("untracked"), "mine\n");
}

TEST_F(MergedSubmodules, DoNotHideWhatIsStagedInTheirFolder)
{
    repository_.git({"branch", "topic"});
    leaveSubmodule();
    repository_.remove("module");
    repository_.write("module/staged", "mine\n");
    repository_.add({"module/staged"});
    EXPECT_THAT(failureOfMerge("topic"), testing::HasSubstr("would be overwritten by merge"));
    EXPECT_THAT(status(), ElementsAre("A  module/staged"));
}

/// Has other entries in the index by the time of the merge's own commit.
class LateEntriesAdapter : public vclink::git::GitAdapter
{
  public:
    using GitAdapter::GitAdapter;

    void commit(const upath &folder, const ustring &message) override
    {
        addEntries();
        GitAdapter::commit(folder, message);
    }

    std::function<void()> addEntries;
};

/// libgit2 leaves such an entry where it could not write the file.
TEST_F(MergedSubmodules, ThatNoParentHasAreNotInAMerge)
{
    theyMove(writes("ours", "x"));
    LateEntriesAdapter adapter(
        asPath(repository_.path()),
        std::static_pointer_cast<vclink::ApplicationInteractor>(interactor_));
    adapter.addEntries = [this]
    {
        for (const auto *name : {"nowhere", "other"})
            repository_.git(
                {"update-index", "--add", "--cacheinfo", "160000," + first_ + ',' + name});
    };
    vclink::git::BranchManager::create(adapter)->merge("topic");
    EXPECT_EQ(repository_.git({"ls-tree", "--name-only", "HEAD", "nowhere"}), "");
    EXPECT_EQ(repository_.git({"show", "HEAD:other"}), repository_.read("other"));
    EXPECT_EQ(merged(), second_);
}

} // namespace
