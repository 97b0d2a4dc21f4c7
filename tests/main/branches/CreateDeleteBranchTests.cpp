// SPDX-License-Identifier: MIT
#include <cstddef>
#include <filesystem>
#include <fstream>
#include <ostream>
#include <string>
#include <type_traits>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "BranchFixture.hpp"

namespace
{

using testing::HasSubstr;
using vclink::git::BranchParameters;
using namespace vclink::test;

class BranchChangeTest : public BranchFixture
{
  protected:
    BranchChangeTest()
    {
        repository_.commitAll(writes("file", "one\n"), "first");
        repository_.git({"tag", "first"});
        repository_.commitAll(writes("file", "two\n"), "second");
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

using CreateBranch = BranchChangeTest;

using DeleteBranch = BranchChangeTest;

TEST_F(CreateBranch, MakesOneReferenceAndChangesNothingElse)
{
    RepositoryState expected = stateOf(repository_);
    expected.references = "refs/heads/main " + idOf("main") + "\nrefs/heads/topic " + idOf("main") +
                          "\nrefs/tags/first " + idOf("first") + '\n';
    create("topic", "main");
    EXPECT_EQ(stateOf(repository_), expected);
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

TEST_F(CreateBranch, StartsAtAReferenceToACommitOnly)
{
    repository_.git(
        {"-c", "user.name=x", "-c", "user.email=x@y", "tag", "-a", "-m", "message", "annotated"});
    repository_.git({"update-ref", "refs/tags/tree", idOf("HEAD^{tree}")});
    for (const std::string &startPoint :
         {idOf("HEAD"), idOf("HEAD").substr(0, 8), std::string("HEAD~1"), std::string("main^0")})
        EXPECT_THAT(failureOfCreate("topic", startPoint).code,
                    testing::AnyOf(GIT_ENOTFOUND, GIT_EINVALIDSPEC))
            << startPoint;
    for (const auto *startPoint : {"annotated", "tree"})
        EXPECT_EQ(failureOfCreate("topic", startPoint),
                  (Failure{GIT_ENOTFOUND, GIT_ERROR_INVALID,
                           "the requested type does not match the type in the ODB"}));
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

TEST_F(CreateBranch, FailsForANameThatIsNoneOrAFolderOfBranches)
{
    repository_.git({"branch", "folder/topic"});
    for (const auto *name : {"", "a b", "a..b", "a~1", "a^", "a:b", "a?", "a*", "a[", "a\\b",
                             "a.lock", "a/", "@{", "-a", "folder", "main/topic"})
        EXPECT_LT(failureOfCreate(name, "main").code, 0) << name;
}

TEST_F(CreateBranch, TakesNamesWithFoldersAndLetters)
{
    for (const std::string name : {"a/b/c", "gr\xC3\xBC\xC3\x9F", "caf\xE9", "#1", "a,b"})
    {
        create(name, "main");
        EXPECT_EQ(idOf("refs/heads/" + name), idOf("main")) << name;
    }
    create("/a//c", "main");
    EXPECT_EQ(idOf("refs/heads/a/c"), idOf("main")) << "without the slashes too many";
}

TEST_F(CreateBranch, FailsBeforeTheFirstCommit)
{
    repository_.git({"checkout", "--quiet", "--orphan", "unborn"});
    EXPECT_LT(failureOfCreate("topic", "HEAD").code, 0);
    EXPECT_NO_THROW(create("topic", "main"));
}

/// For a branch that is not merged.
TEST_F(DeleteBranch, RemovesOneReferenceAndChangesNothingElse)
{
    const RepositoryState expected = stateOf(repository_);
    repository_.git({"update-ref", "refs/heads/topic",
                     repository_.line({"-c", "user.name=x", "-c", "user.email=x@y", "commit-tree",
                                       "-m", "third", "main^{tree}"})});
    drop("topic");
    EXPECT_EQ(stateOf(repository_), expected);
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

/// Also in a linked working tree, and if several lines are removed, each by a new file.
TEST_F(DeleteBranch, KeepsTheModeOfTheConfiguration)
{
    const auto file = repository_ / ".git/config";
    repository_.git({"worktree", "add", "--quiet", "-b", "second", (folder() / "linked").string()});
    const auto linked = makeAdapter(folder() / "linked");
    const auto branchesOfLinked = vclink::git::BranchManager::create(*linked);
    for (const auto mode : {std::filesystem::perms(0600), std::filesystem::perms(0664)})
    {
        for (auto *const manager : {&branches(), branchesOfLinked.get()})
        {
            for (const std::size_t settings : {1U, 2U, 3U})
            {
                repository_.git({"branch", "topic"});
                for (std::size_t i = 0; i < settings; ++i)
                    repository_.git({"config", "branch.topic.key" + std::to_string(i), "value"});
                std::filesystem::permissions(file, mode);
                manager->deleteBranch("topic");
                EXPECT_EQ(std::filesystem::status(file).permissions(), mode);
                EXPECT_FALSE(repository_.tryGit({"config", "branch.topic.key0"}).succeeded());
            }
        }
    }
}

/// A branch, more of the repository's own configuration, and the user's configuration.
struct SettingsCase
{
    const char *sentence;
    const char *branch;
    const char *settings;
    const char *global;
};

void PrintTo(const SettingsCase &row, std::ostream *stream)
{
    *stream << row.sentence;
}

class SettingsOfADeletedBranch : public DeleteBranch,
                                 public testing::WithParamInterface<SettingsCase>
{
  protected:
    static void append(const std::filesystem::path &path, const char *text)
    {
        std::ofstream(path, std::ios_base::app) << text;
    }
};

TEST_P(SettingsOfADeletedBranch, AreRemovedAsByGit)
{
    const auto &[sentence, branch, settings, global] = GetParam();
    repository_.git({"branch", branch});
    append(repository_ / ".git/included", "[branch \"topic\"]\n\trebase = true\n");
    append(repository_ / ".git/config", settings);
    append(environment().home() / ".gitconfig", global);
    std::filesystem::copy(repository_.path(), folder() / "twin",
                          std::filesystem::copy_options::recursive);
    const GitRepository twin(folder() / "twin");
    twin.git({"branch", "--quiet", "-D", branch});
    drop(branch);
    EXPECT_EQ(repository_.git({"config", "--list"}), twin.git({"config", "--list"}));
    EXPECT_EQ(repository_.git({"for-each-ref"}), twin.git({"for-each-ref"}));
}

const SettingsCase settingsCases[] = {
    {"OfAnOrdinaryBranch", "topic",
     "[branch \"topic\"]\n\tremote = o\n\tmerge = refs/heads/topic\n", ""},
    {"WithoutThoseOfABranchWithADot", "1",
     "[branch \"1\"]\n\tremote = o\n[branch \"1.2\"]\n\tremote = o\n", ""},
    {"WithoutThoseOfSimilarSections", "topic",
     "[subbranch \"topic\"]\n\tkey = 1\n[branch \"Topic\"]\n\tkey = 2\n[branch]\n\ttopic = 3\n"
     "[branch \"topic\"]\n\tkey = 4\n",
     ""},
    {"WithSeveralValues", "topic",
     "[branch \"topic\"]\n\tremote = o\n\tbase = 1\n\tbase = 2\n\tmerge = m\n", ""},
    {"InSeveralSections", "topic",
     "[branch \"topic\"]\n\tremote = o\n[core]\n\tx = y\n[branch \"topic\"]\n\tbase = 2\n", ""},
    {"WithoutThoseOfTheUser", "topic", "[branch \"topic\"]\n\tremote = o\n",
     "[branch \"topic\"]\n\trebase = true\n"},
    {"OfTheUserAlone", "topic", "", "[branch \"topic\"]\n\trebase = true\n"},
    {"WithoutThoseOfAnIncludedFile", "topic",
     "[include]\n\tpath = included\n[branch \"topic\"]\n\tremote = o\n", ""},
    {"WithoutValues", "topic", "[branch \"topic\"]\n\tdescription\n\tremote = \n", ""},
    {"ThatAnIncludedFileHasToo", "topic",
     "[include]\n\tpath = included\n[branch \"topic\"]\n\trebase = false\n", ""},
};

INSTANTIATE_TEST_SUITE_P(It, SettingsOfADeletedBranch, testing::ValuesIn(settingsCases),
                         [](const auto &row) { return row.param.sentence; });

TEST_F(DeleteBranch, FailsIfItsSettingsCannotBeRemoved)
{
    repository_.git({"branch", "topic"});
    repository_.git({"config", "branch.topic.remote", "o"});
    repository_.write(".git/config.lock", "");
    const Failure failure = failureOfDelete("topic");
    EXPECT_EQ(failure.code, GIT_ELOCKED);
    EXPECT_THAT(failure.text, HasSubstr("config.lock"));
    repository_.remove(".git/config.lock");
    const std::string before = repository_.read(".git/config");
    repository_.write(".git/config", before + std::string("[x]\n\ty = a\0b\n", 13));
    EXPECT_THAT(failureOfDelete("topic").text, HasSubstr("NUL"));
    repository_.write(".git/config", before + "[branch \"topic\"]\n\tkey = 1\n\tkey\n");
    EXPECT_THAT(failureOfDelete("topic").text, HasSubstr("without a value"));
    EXPECT_EQ(idOf("topic"), idOf("main"));
}

/// git removes the one and keeps the other. libgit2 would keep the one, or write the other twice.
TEST_F(DeleteBranch, FailsIfASettingIsInTheLineOfAHeader)
{
    repository_.git({"branch", "topic"});
    const std::string before = repository_.read(".git/config");
    for (const std::string line :
         {"[branch \"topic\"] remote = o", "\t[branch \"topic\"]remote=o",
          "[branch \"topic\"]\n\tremote = o\n[remote \"a]\\\"b\"] url = u",
          "[branch \"topic\"][user] name = x\n[branch \"topic\"]\n\tremote = o",
          // A backslash in a comment does not continue the line.
          "[x]\n\ty = a # see c:\\\n[branch \"topic\"] remote = o\n\tmerge = m",
          "[x]\n\ty = \"a;\" ; see c:\\\r\n[branch \"topic\"] remote = o\n\tmerge = m"})
    {
        repository_.write(".git/config", before + line + '\n');
        EXPECT_THAT(failureOfDelete("topic").text, HasSubstr("in the line of the header '"))
            << line;
    }
    repository_.write(".git/config", before + "[remote \"o\"] url = u\n");
    drop("topic");
    EXPECT_EQ(repository_.read(".git/config"), before + "[remote \"o\"] url = u\n");
    // The second of them is a part of a value, which begins like a header.
    for (const std::string line : {"[branch \"topic\"] # mine \\\n\tremote = o\n",
                                   "[branch \"topic\"]\n\tremote = o\n[alias]\n\tup = \"!f() { "
                                   "\\\n[ -n x ] && git status; \\\n}; f\"\n",
                                   "[branch \"topic\"]\n\tremote = o\n[alias]\n\tup = \"!f() { "
                                   "\\\n true; # \\\n[ -n x ] && git status; }; f\"\n"})
    {
        repository_.git({"branch", "topic"});
        repository_.write(".git/config", before + line);
        const auto alias = repository_.tryGit({"config", "alias.up"}).output;
        drop("topic");
        EXPECT_FALSE(repository_.tryGit({"config", "branch.topic.remote"}).succeeded());
        EXPECT_EQ(repository_.tryGit({"config", "alias.up"}).output, alias);
    }
}

TEST_F(DeleteBranch, NeedsNoConfiguration)
{
    repository_.git({"branch", "topic"});
    repository_.remove(".git/config");
    drop("topic");
    EXPECT_FALSE(repository_.tryGit({"rev-parse", "--verify", "topic"}).succeeded());
}

TEST_F(DeleteBranch, FailsForTheCurrentBranchOfThisOrALinkedWorktree)
{
    repository_.git({"worktree", "add", "--quiet", "-b", "second", (folder() / "linked").string()});
    const Failure failure = failureOfDelete("main");
    EXPECT_EQ(failure.code, GIT_ERROR);
    EXPECT_EQ(failure.text, "cannot delete branch 'refs/heads/main' as it is the current HEAD of "
                            "the repository.");
    EXPECT_EQ(failureOfDelete("second").code, GIT_ERROR);
    EXPECT_THAT(failureOfDelete("second").text, HasSubstr("refs/heads/second"));
    repository_.git({"checkout", "--quiet", "--detach"});
    drop("main");
    EXPECT_EQ(repository_.line({"for-each-ref", "--format=%(refname)", "refs/heads"}),
              "refs/heads/second");
}

TEST_F(DeleteBranch, TakesLocalBranchesOnly)
{
    repository_.git({"update-ref", "refs/remotes/origin/far", "first"});
    for (const std::string &name :
         {std::string("origin/far"), std::string("remotes/origin/far"), std::string("first"),
          idOf("first"), std::string("HEAD"), std::string("missing")})
        EXPECT_EQ(failureOfDelete(name).code, GIT_ENOTFOUND) << name;
}

TEST(BranchParametersValue, HoldsCopiesOfWhatItWasGiven)
{
    BranchParameters first("name", "start point");
    const BranchParameters copy = first;
    first = BranchParameters("c", "d");
    EXPECT_EQ(copy.getName(), "name");
    EXPECT_EQ(copy.getStartPoint(), "start point");
    EXPECT_EQ(first.getName() + first.getStartPoint(), "cd");
    EXPECT_TRUE((std::is_same_v<decltype(copy.getName()), std::string>)) << "a copy";
    EXPECT_TRUE((std::is_same_v<decltype(copy.getStartPoint()), std::string>)) << "a copy";
}

} // namespace
