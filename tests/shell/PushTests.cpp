// SPDX-License-Identifier: MIT
#include <gmock/gmock.h>

#include "ShellRemoteFixture.hpp"

namespace vclink::test
{
namespace
{

using testing::HasSubstr;

class ShellPush : public ShellRemoteFixture
{
  protected:
    ShellPush()
    {
        repository_.write("a", "ours\n");
        commit_ = repository_.commitAll("our work");
    }

    std::string served(const std::string &name) const
    {
        const References all = references(served_);
        const auto found = all.find(name);
        return found == all.end() ? "" : found->second;
    }

    /// A hook of the served repository, a script.
    void makeHook(const std::string &name, const std::string &script) const
    {
        served_.write("hooks/" + name, "#!/bin/sh\n" + script);
        served_.setMode("hooks/" + name, 0755);
    }

    /// A commit on the served branch that is not here.
    void overtake() const
    {
        GitRepository colleague = GitRepository::clone(url_, folder() / "colleague");
        colleague.write("a", "theirs\n");
        colleague.commitAll("their work");
        colleague.git({"push", "--quiet", "origin", "main"});
    }

    std::string commit_;
};

TEST_F(ShellPush, MovesABranchAndRemembersWhereItIs)
{
    succeed({"push", "origin", "refs/heads/main"});
    EXPECT_EQ(served("refs/heads/main"), commit_);
    EXPECT_EQ(references(repository_).at("refs/remotes/origin/main"), commit_);
    EXPECT_EQ(served_.git({"fsck", "--no-progress"}), "");
    succeed({"push", "origin", "refs/heads/main"});
    EXPECT_EQ(served("refs/heads/main"), commit_);
}

TEST_F(ShellPush, MakesAndDeletesBranchesAndTags)
{
    repository_.git({"tag", "v1", "main~1"});
    succeed({"push", "origin", "refs/heads/main:refs/heads/new", "refs/tags/v1",
             "HEAD:refs/heads/ub\xC3\xBC"});
    EXPECT_EQ(served("refs/heads/new"), commit_);
    EXPECT_EQ(served("refs/tags/v1"), repository_.line({"rev-parse", "main~1"}));
    EXPECT_EQ(served("refs/heads/ub\xC3\xBC"), commit_);
    succeed({"push", "origin", ":refs/heads/new", ":refs/tags/v1"});
    EXPECT_EQ(served("refs/heads/new"), "");
    EXPECT_EQ(served("refs/tags/v1"), "");
}

TEST_F(ShellPush, LosesNoCommitsOfOthersUnlessToldTo)
{
    overtake();
    const auto reason = [](const std::string &forced)
    {
        return "Nothing was pushed: the branch 'main' at origin has commits that yours does not "
               "have.\nDownload them with \"vclink-shell fetch\", merge them, and push again. To "
               "discard them there instead:\nvclink-shell push origin +" +
               forced + '\n';
    };
    repository_.git({"branch", "topic"});
    EXPECT_EQ(refuse({"push"}), reason("main"));
    EXPECT_EQ(refuse({"push", "origin", "topic", "topic:main"}), reason("topic:main"));
    EXPECT_EQ(served("refs/heads/topic"), "");
    repository_.git({"fetch", "--quiet"});
    EXPECT_EQ(refuse({"push"}), reason("main"));
    for (const std::string configured : {"refs/heads/main", "main", "HEAD", "refs/heads/*", ":"})
    {
        repository_.git({"config", "remote.origin.push", configured});
        EXPECT_EQ(refuse({"push"}), reason("main")) << configured;
    }
    succeed({"push", "origin", "+refs/heads/main"});
    EXPECT_EQ(served("refs/heads/main"), commit_);
}

TEST_F(ShellPush, ReplacesNoTagUnlessToldTo)
{
    repository_.git({"tag", "v1", "main~1"});
    succeed({"push", "origin", "v1"});
    repository_.git({"checkout", "--quiet", "--orphan", "unrelated"});
    repository_.commitAll("unrelated");
    repository_.git({"tag", "--force", "v1"});
    EXPECT_EQ(refuse({"push", "origin", "v1"}),
              "Nothing was pushed: the tag 'v1' is another one at origin. To replace it there:\n"
              "vclink-shell push origin +v1\n");
    succeed({"push", "origin", "+v1"});
    EXPECT_EQ(served("refs/tags/v1"), repository_.line({"rev-parse", "v1"}));
}

/// What is at the address for fetches says nothing then.
TEST_F(ShellPush, GoesToTheAddressForPushes)
{
    const GitRepository fork(folder() / "fork");
    repository_.git({"clone", "--quiet", "--bare", served_.path(), fork.path()});
    succeed({"push", "origin", "main"});
    repository_.git({"config", "remote.origin.pushurl", fork.path().string()});
    EXPECT_EQ(show({"push", "origin", "main"}), "Pushed main to origin.\n");
    EXPECT_EQ(references(fork).at("refs/heads/main"), commit_);
    const std::string reason =
        "Nothing was pushed: origin has another address for pushes, which cannot be listed. Use "
        "full names, e.g. refs/heads/NAME:refs/heads/NAME.\n";
    EXPECT_EQ(refuse({"push", "origin", ":main"}), reason);
    succeed({"push", "origin", "main:new"});
    succeed({"push", "origin", ":refs/heads/new"});
    EXPECT_EQ(references(fork).count("refs/heads/new"), 0U);
    repository_.git({"reset", "--quiet", "--hard", "HEAD~"});
    repository_.write("a", "other\n");
    repository_.commitAll("other work");
    EXPECT_THAT(refuse({"push", "origin", "main"}), HasSubstr("non-fastforwardable"));
    EXPECT_EQ(references(fork).at("refs/heads/main"), commit_);
    repository_.git({"config", "remote.origin.push", ":"});
    EXPECT_EQ(refuse({"push", "origin"}), reason);
}

TEST_F(ShellPush, NamesWhatTheServerRejectsAndPushesTheRest)
{
    makeHook("update", "case $1 in */main) echo closed; exit 1 ;; esac\n");
    const std::string before = served("refs/heads/main");
    const CommandResult result =
        run({"push", "origin", "refs/heads/main", "refs/heads/main:refs/heads/new"});
    EXPECT_EQ(result.exitStatus, 1);
    EXPECT_EQ(result.output, "");
    EXPECT_EQ(result.errors, "Pushed main to new at origin.\n"
                             "remote: closed\n"
                             "remote: error: hook declined to update refs/heads/main\n"
                             "vclink-shell: origin rejected:\n"
                             "  refs/heads/main: hook declined\n");
    EXPECT_EQ(served("refs/heads/main"), before);
    EXPECT_EQ(served("refs/heads/new"), commit_);
}

TEST_F(ShellPush, NamesAllThatTheServerRejects)
{
    makeHook("pre-receive", "exit 1\n");
    EXPECT_EQ(refuse({"push", "origin", "refs/heads/main", "refs/heads/main:refs/heads/new"}),
              "origin rejected:\n  refs/heads/main: pre-receive hook declined\n"
              "  refs/heads/new: pre-receive hook declined\n");
}

TEST_F(ShellPush, TellsTheServersWordsMarkedAsSuch)
{
    makeHook("pre-receive", "echo Not on a Friday; echo 'vclink-shell: lie'; exit 1\n");
    EXPECT_EQ(run({"push", "origin", "refs/heads/main"}).errors,
              "remote: Not on a Friday\nremote: vclink-shell: lie\nvclink-shell: origin rejected:\n"
              "  refs/heads/main: pre-receive hook declined\n");
    const std::string log = run({"--log", "parameter", "push", "origin", "refs/heads/main"}).errors;
    EXPECT_THAT(log, HasSubstr("msgStr=Not on a Friday"));
    EXPECT_THAT(log, HasSubstr("[parameter]  refnameStr=refs/heads/main "
                               "statusStr=pre-receive hook declined\n"));
    EXPECT_THAT(log, HasSubstr("\nremote: Not on a Friday\nremote: vclink-shell: lie\n"
                               "vclink-shell: origin rejected:\n"));
}

TEST_F(ShellPush, TakesWhatIsConfiguredOrTheCurrentBranchWhereNothingIsNamed)
{
    succeed({"push", "origin"});
    EXPECT_EQ(served("refs/heads/main"), commit_);
    repository_.git({"config", "remote.origin.push", "refs/heads/main:refs/heads/mine"});
    succeed({"push", "origin"});
    EXPECT_EQ(served("refs/heads/mine"), commit_);
    repository_.git({"config", "--unset", "remote.origin.push"});
    repository_.git({"checkout", "--quiet", "--detach"});
    for (const std::vector<std::string> &arguments :
         {std::vector<std::string>{"push"}, std::vector<std::string>{"push", "origin", "HEAD"}})
        EXPECT_EQ(refuse(arguments), "Nothing was pushed: there is no current branch. Name what to "
                                     "push, e.g. HEAD:refs/heads/NAME.\n");
}

/// Each beside git.
TEST_F(ShellPush, ResolvesThePatternsThatAreConfigured)
{
    repository_.git({"branch", "topic", "main~1"});
    repository_.git({"branch", "side/one"});
    repository_.git({"tag", "v1"});
    const std::vector<std::string> settings[] = {
        {":"},
        {"refs/heads/*"},
        {"refs/heads/side/*:refs/heads/*/theirs"},
        {"+refs/heads/main:refs/heads/over", "refs/tags/*:refs/tags/release/*"},
        {"refs/heads/none/*"},
        {"HEAD", "topic"}};
    for (const std::vector<std::string> &setting : settings)
    {
        const std::string name = "remote" + std::to_string(&setting - settings);
        const GitRepository ours(folder() / name);
        const GitRepository gits(folder() / (name + "-git"));
        for (const GitRepository &remote : {ours, gits})
        {
            repository_.git({"clone", "--quiet", "--bare", served_.path(), remote.path()});
            repository_.git({"remote", "add", remote.path().filename(), remote.path()});
            for (const std::string &refspec : setting)
                repository_.git({"config", "--add",
                                 "remote." + remote.path().filename().string() + ".push", refspec});
        }
        succeed({"push", ours.path().filename()});
        repository_.git({"push", "--quiet", gits.path().filename()});
        EXPECT_EQ(references(ours), references(gits)) << setting.front();
    }
}

TEST_F(ShellPush, ChoosesTheRemoteAsGitDoes)
{
    const GitRepository other(folder() / "other");
    repository_.git({"clone", "--quiet", "--bare", served_.path(), other.path()});
    repository_.git({"remote", "add", "other", other.path().string()});
    const struct
    {
        std::string key;
        std::string value;
        bool goesToOther;
    } cases[] = {{"branch.main.remote", ".", false},
                 {"branch.main.remote", "other", true},
                 {"remote.pushDefault", "origin", false},
                 {"branch.main.pushRemote", "other", true}};
    for (const auto &[key, value, goesToOther] : cases)
    {
        const std::string name = "refs/heads/" + key + '/' + (value == "." ? "here" : value);
        repository_.git({"config", key, value});
        repository_.git({"config", "remote.origin.push", "refs/heads/main:" + name});
        repository_.git({"config", "remote.other.push", "refs/heads/main:" + name});
        succeed({"push"});
        EXPECT_EQ(references(goesToOther ? other : served_).count(name), 1U) << key << value;
        EXPECT_EQ(references(goesToOther ? served_ : other).count(name), 0U) << key << value;
    }
}

TEST_F(ShellPush, CompletesShortNames)
{
    repository_.git({"tag", "v1"});
    repository_.git({"branch", "topic"});
    succeed({"push", "origin", "topic", "v1", "main:new", "v1:v2", "HEAD:refs/heads/head"});
    for (const std::string name :
         {"refs/heads/topic", "refs/tags/v1", "refs/heads/new", "refs/tags/v2", "refs/heads/head"})
        EXPECT_EQ(served(name), commit_) << name;
    succeed({"push", "origin", ":topic", ":v2", "+HEAD"});
    EXPECT_EQ(served("refs/heads/topic") + served("refs/tags/v2"), "");
    EXPECT_EQ(served("refs/heads/main"), commit_);
    repository_.git({"tag", "topic"});
    EXPECT_EQ(refuse({"push", "origin", "topic"}),
              "Nothing was pushed: there are a branch and a tag 'topic'. Use refs/heads/topic or "
              "refs/tags/topic.\n");
    EXPECT_EQ(refuse({"push", "origin", "nothing"}),
              "Nothing was pushed: there is no branch and no tag 'nothing' here.\n");
    EXPECT_EQ(refuse({"push", "origin", ":nothing"}),
              "Nothing was pushed: the remote has no branch and no tag 'nothing'. Use a full name, "
              "e.g. refs/heads/nothing.\n");
}

TEST_F(ShellPush, RefusesWhatNamesNoCommit)
{
    for (const std::string target : {"refs/heads/new", "new"})
        EXPECT_EQ(refuse({"push", "origin", "missing:" + target}),
                  "Nothing was pushed: there is no branch and no tag 'missing' here.\n");
    EXPECT_EQ(refuse({"push", "origin", "mian"}),
              "Nothing was pushed: there is no branch and no tag "
              "'mian' here. Did you mean 'main'?\n");
    EXPECT_EQ(refuse({"push", "origin", "main~1:new"}),
              "Nothing was pushed: there is no branch and no tag 'main~1' here. Did you mean "
              "'main'?\n");
    EXPECT_EQ(refuse({"push", "nobody", "refs/heads/main"}),
              "There is no remote 'nobody'. Remotes: origin.\n");
    EXPECT_EQ(refuse({"push", "main"}), "There is no remote 'main'. 'main' is a branch: name the "
                                        "remote before it, e.g. \"origin main\".\n");
}

TEST_F(ShellPush, GoesToAnotherFolderIfThatHasNoFilesOnTheDisk)
{
    const GitRepository bare(folder() / "bare");
    repository_.git({"clone", "--quiet", "--bare", ".", bare.path()});
    repository_.git({"remote", "add", "near", "../bare"});
    EXPECT_EQ(
        runIn(repository_ / "folder", {"push", "near", "refs/heads/main:refs/heads/new"}).errors,
        "");
    EXPECT_EQ(references(bare).at("refs/heads/new"), commit_);

    GitRepository::clone(url_, folder() / "colleague");
    repository_.git({"remote", "add", "colleague", "../colleague"});
    EXPECT_THAT(refuse({"push", "colleague", "refs/heads/main"}), HasSubstr("non-bare"));
}

TEST_F(ShellPush, TellsAPersonWhatWasPushedWhere)
{
    EXPECT_EQ(show({"push", "origin", "main", "main:new", "HEAD:refs/heads/third"}),
              "Pushed main to origin.\nPushed main to new at origin.\n"
              "Pushed main to third at origin.\n");
    EXPECT_EQ(show({"push", "origin", ":new"}), "Deleted new at origin.\n");
    EXPECT_EQ(show({"push"}), "Everything is up to date at origin.\n");
    EXPECT_EQ(show({"push", "origin", "main", "main:fourth"}),
              "Pushed main to fourth at origin.\n");
    served_.git({"update-ref", "-d", "refs/heads/main"});
    EXPECT_EQ(show({"push"}), "Pushed main to origin.\n");
    EXPECT_EQ(served("refs/heads/main"), commit_);
}

TEST_F(ShellPush, TellsItsFailureInTheLanguageThatWasAskedFor)
{
    EXPECT_EQ(refuse({"--lang", "de", "push", "nobody", "main"}),
              "Es gibt kein Remote 'nobody'. Remotes: origin.\n");
}

} // namespace
} // namespace vclink::test
