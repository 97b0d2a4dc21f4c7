// SPDX-License-Identifier: MIT
#include <gmock/gmock.h>

#include "ShellRemoteFixture.hpp"
#include "runOnTerminal.hpp"
#include "support/UnprivilegedUser.hpp"
#include "support/libgit2Release.hpp"
#include "transport/listening.hpp"

namespace vclink::test
{
namespace
{

namespace fs = std::filesystem;
using testing::AllOf;
using testing::ContainsRegex;
using testing::EndsWith;
using testing::HasSubstr;
using testing::Not;
using testing::StartsWith;

class ShellClone : public ShellRemoteFixture
{
  protected:
    /// Clones in the test's folder, and has to succeed without a word.
    GitRepository clone(const std::string &specifier, const std::string &name = "clone") const
    {
        const CommandResult result = runIn(folder().path(), {"clone", specifier, name});
        EXPECT_EQ(result.exitStatus, 0) << result.errors;
        EXPECT_EQ(result.output, "");
        EXPECT_EQ(result.errors, "");
        return GitRepository(folder() / name);
    }

    /// Has to fail, and to leave nothing behind.
    /// @return what it wrote to standard error
    std::string fail(const std::string &specifier) const
    {
        const CommandResult result = runIn(folder().path(), {"clone", specifier, "clone"});
        EXPECT_EQ(result.exitStatus, 1) << specifier;
        EXPECT_EQ(result.output, "") << specifier;
        EXPECT_FALSE(fs::exists(folder() / "clone")) << specifier;
        return result.errors;
    }

    /// What makes one clone different from another.
    static std::string describe(const GitRepository &repository)
    {
        return repository.git({"log", "--format=%H %s", "--all"}) +
               repository.git({"for-each-ref", "--format=%(objectname) %(refname) %(symref)"}) +
               repository.git({"symbolic-ref", "HEAD"}) + repository.git({"ls-files", "--stage"}) +
               repository.git({"status", "--porcelain", "--ignored"}) +
               repository.git({"config", "--local", "--get-regexp", "^(remote|branch)\\."});
    }
};

TEST_F(ShellClone, SaysThatTheRemoteHasAFormatThatLibGit2DoesNotKnow)
{
    const GitRepository other = makeRepository("other");
    const std::string path = other.path().string();
    other.git({"config", "core.repositoryFormatVersion", "1"});
    other.git({"config", "extensions.strange", "true"});
    EXPECT_THAT(fail(path), AllOf(HasSubstr("unsupported extension"),
                                  EndsWith("\nvclink-shell: libgit2 does not know the format of "
                                           "the remote repository; core.repositoryformatversion "
                                           "and extensions in\nits configuration describe it. If "
                                           "git can work with it, use git.\n")));
    other.write(".git/config", "[core]\nrepositoryformatversion = 9\n");
    EXPECT_THAT(fail(path), AllOf(HasSubstr("unsupported repository version"),
                                  HasSubstr("the format of the remote repository; "),
                                  Not(HasSubstr("Neither"))));
}

TEST_F(ShellClone, SaysThatTheRemoteMayNotBeRead)
{
    const GitRepository other = makeRepository("other");
    other.setMode(".git/HEAD", 0);
    giveToUnprivilegedUser(folder().path());
    const std::string errors = runAsUnprivilegedUser([&] { return fail(other.path().string()); });
    EXPECT_THAT(errors, HasSubstr("HEAD' is locked: Permission denied"));
    EXPECT_THAT(errors, HasSubstr("\nvclink-shell: The file is not locked: you have no permission "
                                  "to read or write it. "));
    EXPECT_THAT(errors, Not(HasSubstr("Neither")));
}

TEST_F(ShellClone, MakesAWorkingCopyAsGitDoes)
{
    repository_.git({"push", "--quiet", "origin", "main:other", "main:refs/tags/v1"});
    const GitRepository made = clone(url_);
    EXPECT_EQ(made.read("folder/b"), "b\n");
    EXPECT_EQ(describe(made), describe(GitRepository::clone(url_, folder() / "twin")));
}

TEST_F(ShellClone, PutsTheFilesOfTheServersCurrentBranchOnTheDisk)
{
    repository_.write("a", "on the trunk\n");
    repository_.commitAll("trunk");
    repository_.git({"push", "--quiet", "origin", "main:trunk"});
    served_.git({"symbolic-ref", "HEAD", "refs/heads/trunk"});
    const GitRepository made = clone(url_);
    EXPECT_EQ(made.line({"symbolic-ref", "HEAD"}), "refs/heads/trunk");
    EXPECT_EQ(made.read("a"), "on the trunk\n");
}

TEST_F(ShellClone, TakesAPathFromTheCurrentFolderAndRemembersAllOfIt)
{
    repository_.makeFolder("start");
    const CommandResult result =
        runIn(folder().path(), {"-C", "repository/start", "clone", "..", "../../new/clone/"});
    EXPECT_EQ(result.exitStatus, 0) << result.errors;
    const GitRepository made(folder() / "new/clone");
    EXPECT_EQ(made.read("a"), "a\n");
    EXPECT_EQ(made.line({"config", "remote.origin.url"}), repository_.path());
}

TEST_F(ShellClone, RefusesAPathOfNothing)
{
    for (const std::string name : {"typo", "./a:b", "/nowhere/x"})
    {
        const CommandResult result = runIn(repository_.path(), {"clone", name});
        EXPECT_EQ(result.exitStatus, 1);
        EXPECT_EQ(result.errors, "vclink-shell: Nothing was cloned: " + name +
                                     " can't be found: No such file or directory.\n");
        EXPECT_FALSE(fs::exists(repository_ / name));
    }
}

TEST_F(ShellClone, TakesAnAddressOfAFileAsItStands)
{
    const std::string address = "file://" + repository_.path().string();
    EXPECT_EQ(clone(address).line({"config", "remote.origin.url"}), address);
}

TEST_F(ShellClone, TakesNamesInAnyLetters)
{
    for (const std::string name : {"a b", "ub\xC3\xBC", "\xE6\x97\xA5\xE6\x9C\xAC", "[x]", "a,b",
                                   "quo\"te", "-x", "byte\xFF"})
    {
        const fs::path source = folder() / "sources" / name;
        fs::create_directories(source.parent_path());
        fs::copy(repository_.path(), source, fs::copy_options::recursive);
        const CommandResult result =
            runIn(source.parent_path(), {"clone", "--", name, "../" + name});
        EXPECT_EQ(result.exitStatus, 0) << result.errors;
        const GitRepository made(folder() / name);
        EXPECT_EQ(made.read("a"), "a\n");
        EXPECT_EQ(made.line({"config", "remote.origin.url"}), source);
    }
}

TEST_F(ShellClone, MakesAnEmptyWorkingCopyOfAnEmptyRepository)
{
    const GitRepository empty = server().makeRepository();
    const GitRepository made = clone(server().url(empty));
    EXPECT_EQ(made.git({"status", "--porcelain", "--ignored"}), "");
    EXPECT_EQ(made.line({"config", "remote.origin.url"}), server().url(empty));
}

TEST_F(ShellClone, SaysThatTheCurrentBranchOfTheRemoteDoesNotExist)
{
    served_.git({"symbolic-ref", "HEAD", "refs/heads/missing"});
    const CommandResult result = runIn(folder().path(), {"clone", url_, "clone"});
    EXPECT_EQ(result.exitStatus, 0);
    EXPECT_EQ(result.errors,
              "vclink-shell: The remote's current branch does not exist, so no files were written. "
              "List its branches with\n\"vclink-shell branches -r\", and check one out with "
              "\"git switch NAME\".\n");
    const GitRepository made(folder() / "clone");
    EXPECT_EQ(runIn(made.path(), {"branches", "-r"}).output, "origin/main\n");
    made.git({"switch", "--quiet", "main"});
    EXPECT_EQ(made.read("a"), "a\n");
}

TEST_F(ShellClone, TakesAnEmptyFolderAndNoOther)
{
    fs::create_directory(folder() / "empty");
    EXPECT_EQ(clone(url_, "empty").read("a"), "a\n");

    GitRepository full(folder() / "full");
    full.write("mine", "mine\n");
    const CommandResult result = runIn(folder().path(), {"clone", url_, "full"});
    EXPECT_EQ(result.exitStatus, 1);
    EXPECT_EQ(result.errors,
              "vclink-shell: Nothing was cloned: full exists, and is not an empty folder.\n");
    EXPECT_EQ(full.read("mine"), "mine\n");
    EXPECT_FALSE(fs::exists(full / ".git"));

    const CommandResult below = runIn(folder().path(), {"clone", url_, "full/mine/clone"});
    EXPECT_EQ(below.exitStatus, 1);
    EXPECT_THAT(below.errors, StartsWith("vclink-shell: Git could not complete the operation: "));
    EXPECT_EQ(full.read("mine"), "mine\n");
}

/// No file can have a content. libgit2 can't even set the repository up, and removes nothing then.
TEST_F(ShellClone, RemovesWhatItMadeWhereNothingCanBeWritten)
{
    fs::create_directory(folder() / "empty");
    for (const std::string name : {"new", "empty", "below/new"})
    {
        const CommandResult result =
            Command({"sh", "-c", "trap '' XFSZ; ulimit -f 0; exec \"$0\" clone \"$1\" \"$2\"",
                     VCLINK_SHELL, url_, name})
                .in(folder().path())
                .environment("ASAN_OPTIONS", "detect_leaks=0")
                .run();
        EXPECT_EQ(result.exitStatus, 1);
        EXPECT_EQ(fs::exists(folder() / name), name == "empty") << name;
    }
    EXPECT_TRUE(fs::is_empty(folder() / "empty"));
}

/// As git. libgit2 fails when it writes the files.
TEST_F(ShellClone, KeepsALinkToItsFolderIfItFails)
{
    GitRepository broken = GitRepository::init(folder() / "broken");
    broken.write("a", "a\n");
    broken.commitAll("first");
    const std::string id = broken.line({"rev-parse", "HEAD:a"});
    fs::remove(broken / (".git/objects/" + id.substr(0, 2) + '/' + id.substr(2)));
    fs::create_directory(folder() / "real");
    fs::create_directory_symlink("real", folder() / "link");
    const CommandResult result = runIn(folder().path(), {"clone", broken.path().string(), "link"});
    EXPECT_EQ(result.exitStatus, 1);
    EXPECT_TRUE(fs::is_symlink(folder() / "link"));
    EXPECT_TRUE(fs::is_empty(folder() / "real"));
}

TEST_F(ShellClone, TellsWhyThereIsNothingToClone)
{
    fs::create_directory(folder() / "nothing");
    EXPECT_THAT(fail("nothing"), HasSubstr("could not find repository"));
    EXPECT_THAT(fail("nowhere"), HasSubstr("nowhere can't be found"));
    EXPECT_THAT(fail("strange://host/path"),
                HasSubstr(libgit2_release::refusalOfScheme("strange://host/path")));
    EXPECT_THAT(fail(server().base() + "/missing.git"), HasSubstr("no such repository"));
    const std::string silent = std::to_string(freePorts(1).front());
    EXPECT_THAT(fail("git://127.0.0.1:" + silent + "/a.git"), HasSubstr("Connection refused"));
}

TEST_F(ShellClone, TellsItsFailureInTheLanguageThatWasAskedFor)
{
    const CommandResult result =
        runIn(folder().path(), {"--lang", "de", "clone", "strange://host/path", "clone"});
    EXPECT_EQ(result.exitStatus, 1);
    EXPECT_THAT(result.errors, StartsWith("vclink-shell: Git konnte den Vorgang nicht "));
}

TEST_F(ShellClone, ShowsTheProgressOfItsCheckout)
{
    const CommandResult result =
        runIn(folder().path(), {"--progress", "always", "clone", url_, "clone"});
    EXPECT_EQ(result.exitStatus, 0);
    EXPECT_THAT(result.errors, ContainsRegex("% Checking out (a|folder/b)"));
    EXPECT_THAT(result.errors, EndsWith("\r\33[K"));
}

TEST_F(ShellClone, ShowsWhatTheLibraryLogs)
{
    const CommandResult all =
        runIn(folder().path(), {"--log", "parameter,progress", "clone", url_, "all"});
    EXPECT_EQ(all.exitStatus, 0);
    EXPECT_THAT(all.errors, HasSubstr("[parameter]  repositorySpecifier=" + url_));
    EXPECT_THAT(all.errors, HasSubstr("[progress] Transfer Progress (Objects / Bytes): "));
    EXPECT_THAT(all.errors, HasSubstr("[parameter]  ref=refs/remotes/origin/main\n"));
    EXPECT_THAT(all.errors, HasSubstr("[progress] Checkout Notify : "));

    const CommandResult some = runIn(folder().path(), {"--log", "progress", "clone", url_, "some"});
    EXPECT_EQ(some.exitStatus, 0);
    EXPECT_THAT(some.errors, HasSubstr("[progress] Transfer Progress (Objects / Bytes): "));
    EXPECT_THAT(some.errors, Not(HasSubstr("[parameter]")));
}

TEST_F(ShellClone, TellsAPersonWhereItClonesTo)
{
    const std::string target = folder() / "clone";
    const TerminalResult result = runOnTerminal(onTerminal("dumb", {"clone", url_, target}));
    EXPECT_EQ(result.exitStatus, 0);
    EXPECT_EQ(result.text, "Cloning into " + target + ":\nDone.\n");
}

} // namespace
} // namespace vclink::test
