// SPDX-License-Identifier: MIT
#include <array>
#include <ctime>

#include <fcntl.h>
#include <gmock/gmock.h>
#include <sys/stat.h>
#include <unistd.h>

#include "ChangeFixture.hpp"
#include "runOnTerminal.hpp"

namespace vclink::test
{
namespace
{

using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::Not;
using testing::Pair;

class ShellCommit : public ChangeFixture
{
  protected:
    void setIdentity() const
    {
        repository_.identify("A. U. Thor", "author@example.org");
    }
    /// The commit at HEAD below its first lines, byte by byte.
    std::string message() const
    {
        const std::string commit = repository_.git({"cat-file", "commit", "HEAD"});
        return commit.substr(commit.find("\n\n") + 2);
    }
    std::string format(const std::string &what) const
    {
        return repository_.line({"log", "-1", "--format=" + what});
    }
};

TEST_F(ShellCommit, TakesAllChangesOfTrackedFiles)
{
    setIdentity();
    const std::string before = repository_.line({"rev-parse", "HEAD"});
    repository_.write("a", "edited\n");
    repository_.remove("b");
    repository_.write("new", "");
    repository_.write("added", "");
    succeed({"add", "added"});
    succeed({"rm", "folder/c"});
    succeed({"commit", "-m", "Work"});
    EXPECT_THAT(committed(), ElementsAre(".gitignore", "a", "added", "folder/deep/d"));
    EXPECT_EQ(repository_.git({"show", "HEAD:a"}), "edited\n");
    EXPECT_THAT(letters(), ElementsAre(Pair("folder/c", "??"), Pair("new", "??")));
    EXPECT_EQ(format("%P"), before);
    EXPECT_EQ(format("%an <%ae> %cn <%ce>"),
              "A. U. Thor <author@example.org> A. U. Thor <author@example.org>");
}

TEST_F(ShellCommit, TakesTheMessageAsItStands)
{
    setIdentity();
    for (const std::string &text :
         {std::string(), std::string("  two\n\nlines \n\n"), std::string("-m"), std::string("--"),
          std::string("--as-is"), std::string("[a,b]"), std::string("{}"), std::string("#"),
          std::string("Gr\xC3\xBC\xC3\x9F"
                      "e \xF0\x9F\x8C\x8D"),
          std::string("not UTF-8 \xFF \xE2\x82"), std::string(100'000, 'x')})
    {
        succeed({"commit", "--allow-empty", "--allow-empty-message", "-m", text});
        EXPECT_EQ(message(), text);
    }
}

TEST_F(ShellCommit, TakesAMessageThatIsGivenInOneWordWithItsOption)
{
    setIdentity();
    succeed({"commit", "--allow-empty", "-mone word"});
    EXPECT_EQ(message(), "one word");
}

TEST_F(ShellCommit, MakesAnIdentityFromTheUserAndTheHost)
{
    char host[1024] = {};
    ASSERT_EQ(::gethostname(host, sizeof host), 0);
    const CommandResult result = shell({"commit", "--allow-empty", "-m", "Work"})
                                     .in(repository_.path())
                                     .environment("USER", "builder")
                                     .run();
    EXPECT_EQ(result.exitStatus, 0) << result.errors;
    EXPECT_EQ(format("%an %ae"), std::string("builder builder@") + host);
}

TEST_F(ShellCommit, IsRefusedWithoutAnyIdentity)
{
    repository_.write("a", "edited\n");
    EXPECT_EQ(refuse({"commit", "-m", "Work"}),
              "Git does not know who makes this commit. Set user.name and user.email in the Git "
              "configuration, and try again.\n");
}

TEST_F(ShellCommit, IsRefusedWhileFilesAreInConflict)
{
    setIdentity();
    makeConflict();
    repository_.write("new", "");
    EXPECT_EQ(refuse({"commit", "-m", "Work"}),
              "Nothing was committed, because these files are in conflict:\n"
              "  a\n"
              "Edit each until it is right, and mark it with \"vclink-shell resolved\". With "
              "--as-is the commit\ntakes them as they are, with any conflict markers.\n");
}

/// Also those that nobody has changed, and those that are as new as the index: their state is
/// clean.
TEST_F(ShellCommit, IsRefusedIfItWouldStoreFilesThatGitConverts)
{
    setIdentity();
    repository_.git({"config", "filter.large.clean", "tr A-Z a-z"});
    repository_.git({"config", "filter.large.smudge", "tr a-z A-Z"});
    repository_.git({"config", "filter.smudged.smudge", "cat"});
    repository_.write(".gitattributes", "*.large filter=large\n*.smudged filter=smudged\n"
                                        "*.latin working-tree-encoding=latin1\n"
                                        "*.utf working-tree-encoding=utf8\n");
    const std::vector<std::string> names{"folder/b.large", "new.large", "touched.large",
                                         "u.latin",        "u.utf",     "v.smudged"};
    const auto setTime = [&](const std::string &name, std::time_t time)
    {
        const std::array<timespec, 2> times{timespec{time, 0}, timespec{time, 0}};
        ASSERT_EQ(::utimensat(AT_FDCWD, (repository_ / name).c_str(), times.data(), 0), 0);
    };
    for (const std::string &name : names)
    {
        repository_.write(name, "TEXT\n");
        setTime(name, 1'000'000'000);
    }
    repository_.commitAll("converted");
    const auto refuseWith = [&](const std::string &list)
    {
        EXPECT_EQ(refuse({"commit", "-m", "Work"}),
                  "Nothing was committed, because git converts these files before it stores them, "
                  "and vclink-shell\ncannot:\n" +
                      list +
                      "Use \"git commit -a\". If you have not changed them, \"git status\" is "
                      "enough: then commit again. With\n--as-is the commit stores what is on the "
                      "disk.\n");
    };
    repository_.write("a", "edited\n");
    setTime("touched.large", 1'000'000'001);
    refuseWith("  touched.large\n");
    setTime("new.large", std::time(nullptr) + 1'000);
    repository_.git({"status"});
    refuseWith("  new.large\n");
    setTime("new.large", 1'000'000'000);
    repository_.git({"status"});
    for (const std::string &name : names)
        repository_.write(name, "EDIT\n");
    refuseWith("  folder/b.large\n  new.large\n  touched.large\n  u.latin\n");
    for (const std::string &name : names)
        setTime(name, 1'000'000'002);
    repository_.add();
    succeed({"commit", "-m", "Staged by git"});
    EXPECT_EQ(repository_.git({"show", "HEAD:new.large"}), "edit\n");
    EXPECT_EQ(repository_.git({"show", "HEAD:v.smudged"}), "EDIT\n");
    setTime("touched.large", 1'000'000'003);
    succeed({"commit", "--as-is", "-m", "As it is"});
    EXPECT_EQ(repository_.git({"show", "HEAD:touched.large"}), "EDIT\n");
}

TEST_F(ShellCommit, IsRefusedWithoutAMessageOrAChange)
{
    setIdentity();
    EXPECT_EQ(refuse({"commit", "-m", "Work"}),
              "Nothing was committed: no tracked file has changed.\n");
    repository_.write("new", "");
    EXPECT_EQ(refuse({"commit", "-m", "Work"}),
              "Nothing was committed: no tracked file has changed.\nUntracked: 1 file. To commit "
              "them, add them with \"vclink-shell add\".\n");
    repository_.write("a", "edited\n");
    for (const std::string text : {"", " \n\t"})
        EXPECT_EQ(refuse({"commit", "-m", text}), "Nothing was committed: the message is empty.\n");
    succeed({"commit", "-m", "Work"});
    EXPECT_THAT(refuse({"commit", "-am", "Work"}), HasSubstr("no tracked file"));
    succeed({"commit", "--allow-empty", "-am", "[Work]"});
    EXPECT_EQ(message(), "[Work]");
}

TEST_F(ShellCommit, IsDoneIfNothingIsLeftThatHasAState)
{
    setIdentity();
    for (const std::string name : {"a", "b", "folder", ".gitignore", "x.ignored"})
        repository_.remove(name);
    ASSERT_EQ(::mkfifo((repository_ / "fifo").c_str(), 0600), 0);
    succeed({"commit", "-m", "Without files"});
    EXPECT_EQ(repository_.git({"ls-tree", "HEAD"}), "");
    succeed({"status"});
    repository_.write("kept", "kept\n");
    repository_.add({"kept"});
    repository_.commitAll("kept");
    repository_.write(".git/info/exclude", "ignored\n");
    repository_.write("ignored", "");
    repository_.remove("kept");
    succeed({"commit", "-m", "Ignored files only"});
    EXPECT_EQ(message(), "Ignored files only");
}

TEST_F(ShellCommit, ConcludesAMergeThatChangesNothing)
{
    setIdentity();
    makeConflict();
    repository_.write("a", "ours\n");
    repository_.write("b", "b\n");
    repository_.git({"add", "a", "b"});
    succeed({"commit", "-m", "Ours"});
    EXPECT_EQ(split(format("%P"), ' ').size(), 2U);
}

TEST_F(ShellCommit, TakesFilesInConflictAsTheyStandWhenToldTo)
{
    setIdentity();
    makeConflict();
    const std::string other = repository_.line({"rev-parse", "other"});
    const std::string before = repository_.line({"rev-parse", "main"});
    const std::string text = repository_.read("a");
    ASSERT_THAT(text, HasSubstr("<<<<<<<"));
    succeed({"commit", "--as-is", "-m", "As it is"});
    EXPECT_EQ(repository_.git({"show", "HEAD:a"}), text);
    EXPECT_EQ(format("%P"), before + ' ' + other);
    EXPECT_THAT(letters(), IsEmpty());
    EXPECT_FALSE(std::filesystem::exists(repository_ / ".git/MERGE_HEAD"));
}

TEST_F(ShellCommit, ConcludesAMergeOnceItsConflictIsResolved)
{
    setIdentity();
    makeConflict();
    repository_.write("a", "solution\n");
    succeed({"resolved", "a"});
    succeed({"commit", "-m", "Merge"});
    EXPECT_EQ(split(format("%P"), ' ').size(), 2U);
    EXPECT_EQ(repository_.git({"show", "HEAD:a"}), "solution\n");
    EXPECT_EQ(repository_.git({"show", "HEAD:b"}), "theirs\n");
    EXPECT_FALSE(std::filesystem::exists(repository_ / ".git/MERGE_HEAD"));
}

TEST_F(ShellCommit, MakesTheFirstCommitOfARepository)
{
    const GitRepository empty = makeRepository("empty");
    empty.write("file", "");
    EXPECT_EQ(runIn(empty.path(), {"add", "file"}).exitStatus, 0);
    EXPECT_EQ(
        shell({"commit", "-m", "First"}).in(empty.path()).environment("LOGNAME", "me").run().errors,
        "");
    EXPECT_EQ(empty.git({"log", "--format=%an %s %P"}), "me First \n");
    EXPECT_EQ(empty.git({"status", "--porcelain"}), "");
}

TEST_F(ShellCommit, CountsNoFileThatASparseCheckoutLeavesOut)
{
    setIdentity();
    repository_.git({"update-index", "--skip-worktree", "b"});
    repository_.remove("b");
    repository_.write("a", "edited\n");
    const TerminalResult result = runOnTerminal(
        {"env", "TERM=dumb", VCLINK_SHELL, "-C", repository_.path().string(), "commit", "-m", "x"});
    EXPECT_EQ(result.text, "Committed 1 file.\n");
    EXPECT_THAT(committed(), ElementsAre(".gitignore", "a", "b", "folder/c", "folder/deep/d"));
}

TEST_F(ShellCommit, KeepsControlCharactersOfNamesInConflictFromTheTerminal)
{
    repository_.write("\33[31m", "begin\n");
    repository_.commitAll("odd");
    repository_.git({"checkout", "--quiet", "-b", "odd"});
    repository_.write("\33[31m", "theirs\n");
    repository_.commitAll("theirs");
    repository_.git({"checkout", "--quiet", "main"});
    repository_.write("\33[31m", "ours\n");
    repository_.commitAll("ours");
    repository_.tryGit({"-c", "user.name=A", "-c", "user.email=a@example.org", "merge", "odd"});
    const std::string reason = refuse({"commit", "-m", "Work"});
    EXPECT_THAT(reason, HasSubstr("  \"\\033[31m\"\n"));
    EXPECT_THAT(reason, Not(HasSubstr("\33")));
}

} // namespace
} // namespace vclink::test
