// SPDX-License-Identifier: MIT
#include <filesystem>
#include <string>
#include <type_traits>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "BranchFixture.hpp"
#include "support/Descriptors.hpp"
#include "vclink/git/LibGit2Exception.hpp"

namespace
{

using testing::HasSubstr;
using testing::IsEmpty;
using vclink::git::BranchParameters;
using vclink::test::Failure;
using vclink::test::failureOf;
using vclink::test::NothingChanges;
using vclink::test::RepositoryState;
using vclink::test::splitLines;
using vclink::test::stateOf;

class BranchChangeTest : public vclink::test::BranchFixture
{
  protected:
    BranchChangeTest()
    {
        repository_.write("file", "one\n");
        repository_.commitAll("first");
        repository_.git({"tag", "first"});
        repository_.write("file", "two\n");
        repository_.commitAll("second");
    }

    void create(const std::string &name, const std::string &startPoint) const
    {
        branches().createBranch(BranchParameters(name, startPoint));
    }
    void drop(const std::string &name) const
    {
        branches().deleteBranch(name);
    }
    Failure failureOfCreate(const std::string &name, const std::string &startPoint) const
    {
        const NothingChanges nothing(repository_);
        return failureOf([&] { create(name, startPoint); });
    }
    Failure failureOfDelete(const std::string &name) const
    {
        const NothingChanges nothing(repository_);
        return failureOf([&] { drop(name); });
    }
};

class CreateBranch : public BranchChangeTest
{
};

class DeleteBranch : public BranchChangeTest
{
};

TEST_F(CreateBranch, MakesOneReferenceAndChangesNothingElse)
{
    RepositoryState before = stateOf(repository_);
    create("topic", "main");
    RepositoryState after = stateOf(repository_);
    EXPECT_EQ(after.references, "refs/heads/main " + idOf("main") + "\nrefs/heads/topic " +
                                    idOf("main") + "\nrefs/tags/first " + idOf("first") + '\n');
    before.references.clear();
    after.references.clear();
    EXPECT_EQ(after, before);
}

TEST_F(CreateBranch, StartsAtAnyNameOfAReference)
{
    repository_.git({"branch", "old", "first"});
    repository_.git({"update-ref", "refs/remotes/origin/far", "first"});
    for (const std::string startPoint :
         {"first", "refs/tags/first", "old", "heads/old", "refs/heads/old", "origin/far",
          "remotes/origin/far", "HEAD", "main"})
    {
        create("topic", startPoint);
        EXPECT_EQ(idOf("topic"), idOf(startPoint)) << startPoint;
        drop("topic");
    }
}

TEST_F(CreateBranch, StartsAtAReferenceOnly)
{
    for (const std::string &startPoint :
         {idOf("HEAD"), idOf("HEAD").substr(0, 8), std::string("HEAD~1"), std::string("main^0"),
          std::string("missing")})
        EXPECT_THAT(failureOfCreate("topic", startPoint).code,
                    testing::AnyOf(GIT_ENOTFOUND, GIT_EINVALIDSPEC))
            << startPoint;
}

TEST_F(CreateBranch, StartsAtNoAnnotatedTag)
{
    repository_.git(
        {"-c", "user.name=x", "-c", "user.email=x@y", "tag", "-a", "-m", "message", "annotated"});
    const Failure failure = failureOfCreate("topic", "annotated");
    EXPECT_EQ(failure.code, GIT_ENOTFOUND);
    EXPECT_EQ(failure.text, "the requested type does not match the type in the ODB");
}

TEST_F(CreateBranch, StartsAtNoTree)
{
    repository_.git({"update-ref", "refs/tags/tree", idOf("HEAD^{tree}")});
    EXPECT_EQ(failureOfCreate("topic", "tree").code, GIT_ENOTFOUND);
}

TEST_F(CreateBranch, FailsWithAnUnknownStartPointBeforeItTouchesAReference)
{
    const Failure failure = failureOfCreate("topic", "missing");
    EXPECT_EQ(failure.code, GIT_ENOTFOUND);
    EXPECT_EQ(failure.text, "no reference found for shorthand 'missing'");
    // The start point comes first, also where the name would be refused.
    EXPECT_EQ(failureOfCreate("main", "missing"), failure);
}

TEST_F(CreateBranch, FailsForANameThatExists)
{
    repository_.git({"branch", "topic", "first"});
    const Failure failure = failureOfCreate("topic", "main");
    EXPECT_EQ(failure.code, GIT_EEXISTS);
    EXPECT_THAT(failure.text, HasSubstr("already exists"));
    EXPECT_EQ(failureOfCreate("main", "first").code, GIT_EEXISTS) << "the current branch";
}

TEST_F(CreateBranch, FailsForANameThatIsAFolderOfBranches)
{
    repository_.git({"branch", "folder/topic"});
    EXPECT_LT(failureOfCreate("folder", "main").code, 0);
    EXPECT_LT(failureOfCreate("main/topic", "main").code, 0);
}

TEST_F(CreateBranch, FailsForANameThatIsNone)
{
    for (const auto *name : {"", "a b", "a..b", "a~1", "a^", "a:b", "a?", "a*", "a[", "a\\b",
                             "a.lock", "a/", "@{", "-a"})
        EXPECT_LT(failureOfCreate(name, "main").code, 0) << name;
}

TEST_F(CreateBranch, TakesNamesWithFoldersAndLetters)
{
    for (const std::string name : {"a/b/c", "gr\xC3\xBC\xC3\x9F", "caf\xE9", "#1", "a,b"})
    {
        create(name, "main");
        EXPECT_EQ(idOf("refs/heads/" + name), idOf("main")) << name;
    }
}

TEST_F(CreateBranch, TakesASlashTooManyAsNone)
{
    create("/a//b", "main");
    EXPECT_EQ(idOf("refs/heads/a/b"), idOf("main"));
}

TEST_F(CreateBranch, FailsBeforeTheFirstCommit)
{
    repository_.git({"checkout", "--quiet", "--orphan", "unborn"});
    EXPECT_LT(failureOfCreate("topic", "HEAD").code, 0);
    EXPECT_NO_THROW(create("topic", "main"));
}

TEST_F(CreateBranch, LeavesNoDescriptorOpen)
{
    create("one", "main");
    const vclink::test::NoDescriptorLeak noLeak;
    create("two", "main");
    EXPECT_THROW(create("two", "main"), vclink::git::LibGit2Exception);
}

TEST_F(DeleteBranch, RemovesOneReferenceAndChangesNothingElse)
{
    repository_.git({"branch", "topic"});
    RepositoryState before = stateOf(repository_);
    drop("topic");
    RepositoryState after = stateOf(repository_);
    EXPECT_EQ(after.references,
              "refs/heads/main " + idOf("main") + "\nrefs/tags/first " + idOf("first") + '\n');
    before.references.clear();
    after.references.clear();
    EXPECT_EQ(after, before);
}

TEST_F(DeleteBranch, RemovesABranchThatIsNotMerged)
{
    repository_.git({"checkout", "--quiet", "-b", "topic"});
    repository_.commitAll("third");
    repository_.git({"checkout", "--quiet", "main"});
    drop("topic");
    EXPECT_FALSE(repository_.tryGit({"rev-parse", "--verify", "refs/heads/topic"}).succeeded());
}

TEST_F(DeleteBranch, RemovesAPackedBranchWithItsSettingsAndItsReflog)
{
    repository_.git({"branch", "topic"});
    repository_.git({"config", "branch.topic.remote", "origin"});
    repository_.git({"pack-refs", "--all"});
    drop("topic");
    EXPECT_FALSE(repository_.tryGit({"rev-parse", "--verify", "refs/heads/topic"}).succeeded());
    EXPECT_FALSE(repository_.tryGit({"config", "branch.topic.remote"}).succeeded());
    EXPECT_FALSE(std::filesystem::exists(repository_ / ".git/logs/refs/heads/topic"));
}

TEST_F(DeleteBranch, FailsForTheCurrentBranch)
{
    const Failure failure = failureOfDelete("main");
    EXPECT_EQ(failure.code, GIT_ERROR);
    EXPECT_EQ(failure.text, "cannot delete branch 'refs/heads/main' as it is the current HEAD of "
                            "the repository.");
}

TEST_F(DeleteBranch, FailsForTheBranchOfALinkedWorktree)
{
    repository_.git({"worktree", "add", "--quiet", "-b", "second", (folder() / "linked").string()});
    const Failure failure = failureOfDelete("second");
    EXPECT_EQ(failure.code, GIT_ERROR);
    EXPECT_THAT(failure.text, HasSubstr("refs/heads/second"));
}

TEST_F(DeleteBranch, TakesLocalBranchesOnly)
{
    repository_.git({"update-ref", "refs/remotes/origin/far", "first"});
    for (const std::string &name :
         {std::string("origin/far"), std::string("remotes/origin/far"), std::string("first"),
          idOf("first"), std::string("HEAD"), std::string("missing")})
        EXPECT_EQ(failureOfDelete(name).code, GIT_ENOTFOUND) << name;
}

TEST_F(DeleteBranch, RemovesTheBranchThatADetachedHeadWasTakenFrom)
{
    repository_.git({"checkout", "--quiet", "--detach"});
    drop("main");
    EXPECT_THAT(splitLines(repository_.git({"for-each-ref", "refs/heads"})), IsEmpty());
}

TEST_F(DeleteBranch, LeavesNoDescriptorOpen)
{
    repository_.git({"branch", "one"});
    repository_.git({"branch", "two"});
    drop("one");
    const vclink::test::NoDescriptorLeak noLeak;
    drop("two");
    EXPECT_THROW(drop("two"), vclink::git::LibGit2Exception);
}

TEST(BranchParametersValue, HoldsWhatItWasGiven)
{
    const BranchParameters parameters("name", "start point");
    EXPECT_EQ(parameters.getName(), "name");
    EXPECT_EQ(parameters.getStartPoint(), "start point");
    EXPECT_TRUE((std::is_same_v<decltype(parameters.getName()), std::string>)) << "a copy";
    EXPECT_TRUE((std::is_same_v<decltype(parameters.getStartPoint()), std::string>)) << "a copy";
}

TEST(BranchParametersValue, IsCopied)
{
    BranchParameters first("a", "b");
    const BranchParameters copy = first;
    first = BranchParameters("c", "d");
    EXPECT_EQ(copy.getName() + copy.getStartPoint(), "ab");
    EXPECT_EQ(first.getName() + first.getStartPoint(), "cd");
}

} // namespace
