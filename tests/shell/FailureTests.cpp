// SPDX-License-Identifier: MIT
#include <chrono>
#include <filesystem>

#include <gmock/gmock.h>

#include "ShellFixture.hpp"
#include "support/UnprivilegedUser.hpp"

namespace vclink::test
{
namespace
{

using testing::AllOf;
using testing::HasSubstr;
using testing::Not;
using testing::StartsWith;

class ShellFailures : public ShellFixture
{
  protected:
    /// Runs a command as a user who may not read a file, which libgit2 reports as locked.
    void expectDenied(const GitRepository &repository, const std::vector<std::string> &command,
                      const std::string &name) const
    {
        giveToUnprivilegedUser(repository.path());
        const std::string errors =
            runAsUnprivilegedUser([&] { return runIn(repository.path(), command).errors; });
        EXPECT_THAT(errors, HasSubstr(name + "' is locked: Permission denied"));
        EXPECT_THAT(errors, HasSubstr("\nvclink-shell: The file is not locked: you have no "
                                      "permission to read or write it. "));
        EXPECT_THAT(errors, Not(HasSubstr("Try again")));
    }
};

const std::string english = "vclink-shell: Git could not complete the operation: ";
const std::string germanFailure = "vclink-shell: Git konnte den Vorgang nicht abschlie\xC3\x9F"
                                  "en: ";

TEST_F(ShellFailures, TellTheTextOfTheExceptionAndEndWithOne)
{
    const CommandResult result = runIn(makeBrokenRepository().path(), {"status"});
    EXPECT_EQ(result.exitStatus, 1);
    EXPECT_EQ(result.output, "");
    EXPECT_THAT(result.errors, StartsWith(english));
    EXPECT_THAT(result.errors, HasSubstr("missing ']' in section header"));
    EXPECT_THAT(result.errors, HasSubstr("code -1"));
}

TEST_F(ShellFailures, AreToldInTheLanguageThatWasAskedFor)
{
    const GitRepository repository = makeBrokenRepository();
    const CommandResult result = runIn(repository.path(), {"--lang", "de", "status"});
    EXPECT_EQ(result.exitStatus, 1);
    EXPECT_THAT(result.errors, StartsWith(germanFailure));
    EXPECT_THAT(runIn(repository.path(), {"--lang", "ja_JP.UTF-8", "status"}).errors,
                HasSubstr("\xE3\x82\xB3\xE3\x83\xBC\xE3\x83\x89 -1"));
    const CommandResult unknown = runIn(repository.path(), {"--lang", "xx", "status"});
    EXPECT_EQ(unknown.exitStatus, 2);
    EXPECT_THAT(
        unknown.errors,
        StartsWith("vclink-shell: --lang: \"xx\" is none of the languages en, de and ja.\n"));
    EXPECT_THAT(runIn(repository.path(), {"--lang", "ja", "--progress", "x", "status"}).errors,
                HasSubstr("\xE3\x80\x82\n"));
}

TEST_F(ShellFailures, AreToldInTheLanguageOfTheEnvironmentUnlessAnotherWasAskedFor)
{
    const GitRepository repository = makeBrokenRepository();
    const auto run = [&](std::vector<std::string> arguments)
    {
        return shell(std::move(arguments))
            .in(repository.path())
            .environment("LC_ALL", "de_AT.UTF-8")
            .run()
            .errors;
    };
    EXPECT_THAT(run({"status"}), StartsWith(germanFailure));
    EXPECT_THAT(run({"--lang", "en", "status"}), StartsWith(english));
}

TEST_F(ShellFailures, SayWhereNoWorkingCopyWasFound)
{
    std::filesystem::create_directory(folder() / "plain");
    const CommandResult result = runIn(folder() / "plain", {"status"});
    EXPECT_EQ(result.exitStatus, 1);
    EXPECT_EQ(result.output, "");
    EXPECT_EQ(result.errors, "vclink-shell: Neither " + (folder() / "plain").string() +
                                 " nor any folder above it is a Git working copy.\n");
}

TEST_F(ShellFailures, SayWhereARepositoryIsThatCannotBeOpened)
{
    const GitRepository repository = makeRepository("damaged");
    repository.remove(".git/HEAD");
    repository.makeFolder("inside");
    const CommandResult result = runIn(repository / "inside", {"status"});
    EXPECT_EQ(result.exitStatus, 1);
    EXPECT_THAT(result.errors,
                HasSubstr("There is a repository in " + repository.path().string() + ", but"));
}

TEST_F(ShellFailures, SayWhyARepositoryCannotBeOpened)
{
    const GitRepository repository = makeRepository();
    repository.git({"config", "core.repositoryFormatVersion", "9"});
    EXPECT_THAT(
        runIn(repository.path(), {"status"}).errors,
        AllOf(
            HasSubstr("unsupported repository version"),
            HasSubstr("libgit2 does not know the format of this repository; "
                      "core.repositoryformatversion and extensions in\n.git/config describe it.")));
    repository.write(".git/config",
                     "[core]\nrepositoryformatversion = 1\n[extensions]\nstrange = true\n");
    EXPECT_THAT(runIn(repository.path(), {"status"}).errors,
                AllOf(HasSubstr("unsupported extension"), HasSubstr(".git/config describe it.")));
}

TEST_F(ShellFailures, SayHowARepositoryOfAnotherUserIsTrusted)
{
    const GitRepository repository = makeRepository();
    repository.write("file", "");
    giveToUnprivilegedUser(repository.path());
    const CommandResult result = runIn(repository.path(), {"status"});
    const std::string way =
        "\nvclink-shell: The repository belongs to nobody. If you trust it, run: "
        "git config --global --add safe.directory " +
        repository.path().string() + '\n';
    EXPECT_EQ(result.errors.find(way) != std::string::npos, runsAsRoot()) << result.errors;
    EXPECT_EQ(result.exitStatus, runsAsRoot() ? 1 : 0);
}

TEST_F(ShellFailures, NameNoOtherProgramWhereAFileMayNotBeRead)
{
    GitRepository repository = makeRepository();
    repository.write("file", "text\n");
    repository.commitAll("begin");
    repository.write("file", "edited\n");
    repository.git({"config", "user.name", "Person"});
    repository.git({"config", "user.email", "person@example.org"});
    repository.setMode("file", 0200);
    expectDenied(repository, {"commit", "-m", "Work"}, "file");
}

TEST_F(ShellFailures, NameNoOtherProgramWhereAMergeMayNotReadAReference)
{
    GitRepository repository = makeRepository();
    repository.write("file", "text\n");
    repository.commitAll("begin");
    repository.git({"branch", "side"});
    repository.setMode(".git/refs/heads/main", 0200);
    expectDenied(repository, {"merge", "side"}, "main");
}

TEST_F(ShellFailures, NameTheLockThatWasLeftAndItsAge)
{
    GitRepository repository = makeRepository();
    repository.write("a", "");
    repository.commitAll("begin");
    repository.write("new", "");
    const struct
    {
        std::string lock;
        std::vector<std::string> arguments;
    } cases[] = {{"index.lock", {"add", "new"}},
                 {"HEAD.lock", {"switch", "other"}},
                 {"refs/heads/other.lock", {"branch", "-d", "other"}}};
    repository.git({"branch", "other"});
    for (const auto &[lock, arguments] : cases)
    {
        const std::filesystem::path path = repository / ".git" / lock;
        repository.write(".git/" + lock, "");
        std::filesystem::last_write_time(path, std::filesystem::file_time_type::clock::now() -
                                                   std::chrono::hours(3) - std::chrono::minutes(1));
        const CommandResult result = runIn(repository.path(), arguments);
        EXPECT_EQ(result.exitStatus, 1) << lock;
        EXPECT_THAT(
            result.errors,
            HasSubstr("\nvclink-shell: " + path.string() +
                      " was made 3 hours ago. If no other program is using Git here, remove "
                      "it, and try again.\n"));
        repository.remove(".git/" + lock);
        EXPECT_EQ(runIn(repository.path(), arguments).exitStatus, 0) << lock;
        repository.git({"checkout", "--quiet", "main"});
    }
}

TEST_F(ShellFailures, NameOnlyTheLockThatWasInTheWay)
{
    GitRepository repository = makeRepository();
    repository.write("a", "");
    repository.commitAll("begin");
    repository.git({"branch", "side"});
    repository.write("a", "ours\n");
    repository.commitAll("ours");
    repository.git({"checkout", "--quiet", "side"});
    repository.write("b", "theirs\n");
    repository.commitAll("theirs");
    repository.write(".git/index.lock", "");
    repository.write(".git/refs/heads/unrelated.lock", "");
    for (const std::vector<std::string> &arguments :
         {std::vector<std::string>{"merge", "main"},
          std::vector<std::string>{"commit", "--allow-empty", "-m", "Work"}})
    {
        const CommandResult result = runIn(repository.path(), arguments);
        EXPECT_EQ(result.exitStatus, 1);
        EXPECT_THAT(result.errors, HasSubstr("/index.lock was made "));
        EXPECT_THAT(result.errors, Not(HasSubstr("unrelated")));
    }
}

TEST_F(ShellFailures, SayThatTheFolderToWorkInCannotBeEntered)
{
    const CommandResult result = shell({"-C", "nowhere", "version"}).run();
    EXPECT_EQ(result.exitStatus, 1);
    EXPECT_EQ(result.output, "");
    EXPECT_EQ(result.errors, "vclink-shell: The folder nowhere can't be entered: No such file or "
                             "directory.\n");
}

TEST_F(ShellFailures, SayThatTheCurrentFolderIsGone)
{
    const CommandResult result =
        Command({"sh", "-c", "mkdir gone && cd gone && rmdir ../gone && exec \"$0\" status",
                 VCLINK_SHELL})
            .in(folder().path())
            .run();
    EXPECT_EQ(result.exitStatus, 1);
    EXPECT_THAT(result.errors, StartsWith("vclink-shell: The current folder can't be found: "));
}

TEST_F(ShellFailures, SayThatAPathCannotBeResolved)
{
    const GitRepository repository = makeRepository();
    repository.symlink("loop", "loop");
    const CommandResult result = runIn(repository.path(), {"status", "loop/.."});
    EXPECT_EQ(result.exitStatus, 1);
    EXPECT_EQ(result.output, "");
    EXPECT_THAT(result.errors, HasSubstr((repository / "loop").string()));
}

TEST_F(ShellFailures, KeepControlCharactersOfNamesFromTheTerminal)
{
    const CommandResult result = shell({"-C", "a\33[2Jb\xFF", "version"}).run();
    EXPECT_EQ(result.exitStatus, 1);
    EXPECT_THAT(result.errors, HasSubstr("The folder a\\033[2Jb\\377 can't be entered"));
    EXPECT_THAT(result.errors, Not(HasSubstr("\33")));
}

} // namespace
} // namespace vclink::test
