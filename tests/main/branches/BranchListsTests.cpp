// SPDX-License-Identifier: MIT
#include <algorithm>
#include <chrono>
#include <filesystem>
#include <string>
#include <type_traits>
#include <utility>
#include <vector>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/resource.h>

#include "BranchFixture.hpp"
#include "support/ChildProcess.hpp"

namespace
{

using testing::ElementsAre;
using testing::IsEmpty;
using vclink::git::BranchPointer;
using namespace vclink::test;

class BranchLists : public BranchFixture
{
  protected:
    std::vector<std::string> local() const
    {
        return namesOf(branches().getLocalBranches());
    }
    std::vector<std::string> remote() const
    {
        return namesOf(branches().getRemoteBranches());
    }
    std::vector<std::string> byGit(const std::string &below) const
    {
        return split(repository_.git({"for-each-ref", "--format=%(refname)", below}));
    }
};

TEST_F(BranchLists, AreEmptyBeforeTheFirstCommitAndWithADetachedHeadAlone)
{
    for (const bool hasCommit : {false, true})
    {
        if (hasCommit)
        {
            repository_.commitAll("first");
            repository_.git({"checkout", "--quiet", "--detach"});
            repository_.git({"branch", "-D", "main"});
        }
        const NothingChanges nothing(repository_);
        EXPECT_THAT(local(), IsEmpty());
        EXPECT_THAT(remote(), IsEmpty());
    }
}

/// Packed and loose, leading to another, with names that are no ASCII and no UTF-8; what is no
/// branch, or broken, is left out. The manager was made before all of them.
TEST_F(BranchLists, HoldTheFullNameOfEachBranchOnceOnItsOwnSideAsGitDoes)
{
    repository_.commitAll("first");
    EXPECT_THAT(local(), ElementsAre("refs/heads/main"));
    for (const std::string name : {"folder/topic", "gr\xC3\xBC\xC3\x9F", "caf\xE9", "dropped"})
        repository_.git({"branch", name});
    repository_.git({"pack-refs", "--all"});
    repository_.git({"branch", "-D", "dropped"});
    repository_.git({"branch", "loose"});
    repository_.git({"tag", "v1"});
    repository_.git({"symbolic-ref", "refs/heads/alias", "refs/heads/main"});
    repository_.commitAll(writes(".git/refs/heads/broken", "garbage\n"), "main is loose, too");
    for (const std::string name : {"origin/main", "upstream/topic"})
        repository_.git({"update-ref", "refs/remotes/" + name, "HEAD"});
    const std::vector<std::string> expected{"refs/heads/alias", "refs/heads/caf\xE9",
                                            "refs/heads/loose", "refs/heads/folder/topic",
                                            "refs/heads/main",  "refs/heads/gr\xC3\xBC\xC3\x9F"};
    EXPECT_THAT(local(), testing::UnorderedElementsAreArray(expected));
    EXPECT_THAT(local(), testing::UnorderedElementsAreArray(byGit("refs/heads")));
    EXPECT_THAT(remote(), ElementsAre("refs/remotes/origin/main", "refs/remotes/upstream/topic"));
    EXPECT_EQ(remote(), byGit("refs/remotes"));
    EXPECT_EQ(branches().getCurrentBranch().getName(), "main");
}

/// libgit2's iterator ends there.
TEST_F(BranchLists, AreWholeBesideABrokenLinkAsGitsAre)
{
    repository_.commitAll("first");
    for (const std::string name : {"a", "folder/a", "folder/z", "packed", "z"})
        repository_.git({"branch", name});
    repository_.git({"pack-refs", "--all"});
    for (const std::string name : {"a", "folder/a", "folder/z", "main", "z"})
        repository_.git({"update-ref", "refs/heads/" + name,
                         repository_.line({"commit-tree", "HEAD^{tree}", "-m", name})});
    for (const std::string name : {"origin/main", "upstream/new"})
        repository_.git({"update-ref", "refs/remotes/" + name, "HEAD"});
    repository_.git({"branch", "new"});
    repository_.git({"symbolic-ref", "refs/heads/alias", "refs/heads/main"});
    writes(".git/refs/heads/folder/garbage", "garbage\n")(repository_);
    writes(".git/refs/heads/y.lock", "")(repository_);
    for (const std::string link : {"folder/b", "b", "../b", "../remotes/b", "../tags/b"})
        for (const std::string target : {"nowhere", ".", "b"})
        {
            SCOPED_TRACE(link + " -> " + target);
            const auto place = repository_ / ".git/refs/heads" / link;
            std::filesystem::create_symlink(target, place);
            if (target != ".") // git follows the circle
            {
                EXPECT_THAT(local(), testing::UnorderedElementsAreArray(byGit("refs/heads")));
                EXPECT_THAT(remote(), testing::UnorderedElementsAreArray(byGit("refs/remotes")));
            }
            EXPECT_THAT(local(), testing::IsSupersetOf({"refs/heads/z", "refs/heads/new"}));
            EXPECT_THAT(remote(), testing::Contains("refs/remotes/upstream/new"));
            std::filesystem::remove(place);
        }
}

/// git and libgit2's iterator would never end.
TEST_F(BranchLists, FailBesideTwoCirclesThatShareAFolder)
{
    repository_.commitAll("first");
    const auto heads = repository_ / ".git/refs/heads";
    const std::string longName(100, 'x');
    std::filesystem::create_directory(heads / longName);
    using Links = std::vector<std::pair<std::string, std::string>>;
    for (const Links &links : {Links{{"a", "."}, {"b", "."}},
                               {{longName + "/a", ".."}, {longName + "/b", ".."}},
                               {{"a", "../.."}, {"../tags/b", "../heads"}},
                               {{longName + "/a", ".."}, {"b", longName}}})
    {
        SCOPED_TRACE(links[0].second);
        const auto failure = [this]
        {
            // So that the search runs out of them before the links have too many levels.
            const rlimit limit{32, 32};
            ::setrlimit(RLIMIT_NOFILE, &limit);
            const Failure local = failureOf([this] { branches().getLocalBranches(); });
            const Failure remote = failureOf([this] { branches().getRemoteBranches(); });
            const bool isRefused = local.code == GIT_ERROR && local == remote &&
                                   local.text.find("symbolic link") != std::string::npos;
            return isRefused ? "" : "not refused: " + local.text;
        };
        for (const auto &[link, target] : links)
            std::filesystem::create_symlink(target, heads / link);
        EXPECT_EQ(runInChild(failure, std::chrono::milliseconds(5'000)), "");
        std::filesystem::remove(heads / links[1].first);
        EXPECT_THAT(local(), testing::Contains("refs/heads/main"));
        std::filesystem::remove(heads / links[0].first);
    }
    for (const std::string link : {"a", "../remotes/b", "../tags/c"})
    {
        std::filesystem::create_directories((heads / link).parent_path());
        std::filesystem::create_symlink(".", heads / link);
        EXPECT_THAT(local(), testing::Contains("refs/heads/main"));
    }
}

/// Which is not that of their names.
TEST_F(BranchLists, AreInLibGit2sOrder)
{
    repository_.commitAll("first");
    repository_.git({"branch", "a"});
    repository_.git({"pack-refs", "--all"});
    repository_.git({"branch", "z"});
    const auto repository = adapter_->getRepository();
    git_branch_iterator *iterator = nullptr;
    ASSERT_EQ(git_branch_iterator_new(&iterator, repository.get(), GIT_BRANCH_LOCAL), 0);
    std::vector<std::string> expected;
    git_branch_t type{};
    git_reference *branch = nullptr;
    for (; git_branch_next(&branch, &type, iterator) == 0; git_reference_free(branch))
        expected.emplace_back(git_reference_name(branch));
    git_branch_iterator_free(iterator);
    EXPECT_FALSE(std::is_sorted(expected.begin(), expected.end()));
    EXPECT_EQ(local(), expected);
}

TEST_F(BranchLists, HoldTheHeadOfAClonedRemoteAsABranchOfItsOwn)
{
    repository_.commitAll("first");
    const auto clone = GitRepository::clone(repository_.path(), folder() / "clone");
    const auto adapter = makeAdapter(clone.path());
    EXPECT_THAT(namesOf(vclink::git::BranchManager::create(*adapter)->getRemoteBranches()),
                ElementsAre("refs/remotes/origin/HEAD", "refs/remotes/origin/main"));
}

TEST_F(BranchLists, OfManyBranchesAreWhole)
{
    repository_.commitAll("first");
    const std::string head = idOf("HEAD");
    std::string commands;
    for (int i = 0; i < 2000; ++i)
        commands += "create refs/heads/b" + std::to_string(i) + ' ' + head + '\n';
    ASSERT_TRUE(repository_.command({"update-ref", "--stdin"}).input(commands).run().succeeded());
    repository_.git({"pack-refs", "--all"});
    EXPECT_EQ(local(), byGit("refs/heads"));
    EXPECT_EQ(local().size(), 2001U);
}

TEST_F(BranchLists, FailWhereTheRepositoryCannotBeOpened)
{
    repository_.remove(".git");
    const Failure failure = failureOf([this] { local(); });
    EXPECT_EQ(failure.code, -3);
    EXPECT_EQ(failureOf([this] { remote(); }), failure);
}

TEST_F(BranchLists, AreOfOneWorkingCopyAndShownInEach)
{
    repository_.commitAll("first");
    const std::string linked = folder() / "linked";
    repository_.git({"worktree", "add", "--quiet", "-b", "second", linked});
    const auto adapter = makeAdapter(linked);
    const auto manager = vclink::git::BranchManager::create(*adapter);
    EXPECT_EQ(namesOf(manager->getLocalBranches()), local());
    EXPECT_EQ(manager->getCurrentBranch().getName(), "second");
}

TEST(BranchPointerValue, HoldsACopyOfItsName)
{
    const std::string name = "caf\xE9/of-more-than-a-few-characters";
    BranchPointer first(name);
    const BranchPointer copy = first;
    first = BranchPointer("two");
    EXPECT_EQ(copy.getName(), name);
    EXPECT_EQ(name, "caf\xE9/of-more-than-a-few-characters");
    EXPECT_EQ(first.getName(), "two");
    EXPECT_TRUE((std::is_same_v<decltype(copy.getName()), std::string>)) << "a copy";
}

TEST(BranchPointerValue, ComparesNamesExactly)
{
    const BranchPointer branch("main");
    EXPECT_TRUE(branch == BranchPointer("main"));
    EXPECT_FALSE(branch != BranchPointer("main"));
    for (const auto *other : {"Main", "main ", "refs/heads/main", "", "mai"})
    {
        EXPECT_FALSE(branch == BranchPointer(other)) << other;
        EXPECT_TRUE(branch != BranchPointer(other)) << other;
    }
}

} // namespace
