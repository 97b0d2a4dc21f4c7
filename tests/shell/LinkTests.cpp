// SPDX-License-Identifier: MIT
#include <gmock/gmock.h>

#include "ChangeFixture.hpp"
#include "runOnTerminal.hpp"

namespace vclink::test
{
namespace
{

using testing::ElementsAre;
using testing::EndsWith;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::Pair;

namespace fs = std::filesystem;

/// Symbolic links in the working copy, which the library follows: "link" leads to "a", "p/link" to
/// "b", "astray" nowhere, all tracked, beside a "p/x".
class ShellChangeOfLinks : public ChangeFixture
{
  protected:
    ShellChangeOfLinks()
    {
        repository_.symlink("a", "link");
        repository_.write("p/x", "");
        repository_.symlink("../b", "p/link");
        repository_.symlink("nowhere", "astray");
        repository_.commitAll("links");
    }
    void lead(const std::string &name, const std::string &target) const
    {
        repository_.remove(name);
        repository_.symlink(target, name);
    }
    std::string targetOf(const std::string &name) const
    {
        return fs::read_symlink(repository_ / name).string();
    }
    /// Leaves the link "link", or what `theirs` and `ours` lead to, in conflict.
    void makeLinkConflict(const std::string &theirs, const std::string &ours)
    {
        repository_.git({"checkout", "--quiet", "-b", "other"});
        lead("link", theirs);
        repository_.commitAll("their link");
        repository_.git({"checkout", "--quiet", "main"});
        lead("link", ours);
        repository_.commitAll("our link");
        repository_.tryGit(
            {"-c", "user.name=A", "-c", "user.email=a@example.org", "merge", "other"});
        ASSERT_EQ(letters().at("link"), "UU");
    }
};

TEST_F(ShellChangeOfLinks, DoesNotMindOnesThatLeadAwayOrInCircles)
{
    for (const std::string target : {"/etc/hostname", "/", "/usr/share/doc", "circle"})
    {
        fs::remove(repository_ / "circle");
        repository_.symlink(target, "circle");
        repository_.write("b", "edited\n");
        succeed({"revert", "."});
        EXPECT_THAT(letters(), ElementsAre(Pair("circle", "??"))) << target;
    }
    EXPECT_THAT(fail({"rm", "."}), EndsWith(":\n  link\n  p/link\n"));
    EXPECT_THAT(fail({"add", "circle"}), HasSubstr("it is a symbolic link"));
}

TEST_F(ShellChangeOfLinks, RevertsALinkItselfByItsName)
{
    for (const std::string target : {"b", "folder", "nowhere", "/etc", "link"})
        for (const std::string name : {"link", "."})
        {
            lead("link", target);
            repository_.write("a", "edited\n");
            ASSERT_EQ(letters().at("link"), " M");
            succeed({"revert", name});
            EXPECT_EQ(targetOf("link"), "a") << target << ' ' << name;
            EXPECT_EQ(letters().count("link"), 0U);
            EXPECT_EQ(repository_.read("a"), name == "." ? "a\n" : "edited\n");
        }
}

TEST_F(ShellChangeOfLinks, RevertsALinkBelowAFolder)
{
    lead("p/link", "x");
    succeed({"revert", "p"});
    EXPECT_EQ(targetOf("p/link"), "../b");
    lead("p/link", "x");
    succeed({"revert", "p/link"});
    EXPECT_EQ(targetOf("p/link"), "../b");
    EXPECT_THAT(letters(), IsEmpty());
}

TEST_F(ShellChangeOfLinks, RevertsAFileThatBecameALink)
{
    for (const std::string name : {"a", "."})
    {
        lead("a", "b");
        succeed({"revert", name});
        EXPECT_THAT(letters(), IsEmpty());
        EXPECT_FALSE(fs::is_symlink(repository_ / "a"));
        EXPECT_EQ(repository_.read("a"), "a\n");
        EXPECT_EQ(repository_.read("b"), "b\n");
    }
}

TEST_F(ShellChangeOfLinks, RevertsWhatLayBelowAFolderThatBecameALink)
{
    const TemporaryFolder elsewhere;
    for (const std::string name : {"folder", "folder/c", "."})
    {
        lead("folder", elsewhere.path().string());
        succeed({"revert", name});
        EXPECT_FALSE(fs::is_symlink(repository_ / "folder")) << name;
        EXPECT_EQ(repository_.read("folder/c"), "folder/c\n");
        EXPECT_EQ(letters().size(), name == "folder/c" ? 1U : 0U);
        EXPECT_TRUE(fs::is_empty(elsewhere.path()));
        repository_.git({"reset", "--quiet", "--hard"});
    }
}

TEST_F(ShellChangeOfLinks, RevertsALinkThatWasRenamed)
{
    repository_.git({"mv", "link", "renamed"});
    succeed({"revert", "."});
    EXPECT_THAT(letters(), ElementsAre(Pair("renamed", "??")));
    EXPECT_EQ(targetOf("link"), "a");
}

TEST_F(ShellChangeOfLinks, TellsOfALinkThatCannotBeNamed)
{
    repository_.symlink("a", "s*r");
    repository_.commitAll("odd");
    lead("s*r", "b");
    repository_.write("folder/c", "edited\n");
    EXPECT_EQ(
        fail({"revert", "--forget", "."}),
        "vclink-shell: Not all were reverted, because a symbolic link would be followed:\n  s*r\n");
    EXPECT_THAT(letters(), ElementsAre(Pair("s*r", " M")));
}

TEST_F(ShellChangeOfLinks, RevertsNothingThatIsNotTracked)
{
    repository_.symlink("a", "new");
    repository_.write("a", "edited\n");
    EXPECT_EQ(refuse({"revert", "new"}),
              "Nothing was reverted:\n  new: it is not tracked by Git\n");
    repository_.symlink("folder", "door");
    EXPECT_EQ(refuse({"revert", "door/c"}),
              "Nothing was reverted:\n  door/c: Git knows no file of this name\n");
}

TEST_F(ShellChangeOfLinks, RemovesNoneThatLeadsSomewhere)
{
    const std::string reason = "it is a symbolic link, which would be followed: use \"git rm "
                               "--cached\"\n";
    EXPECT_EQ(refuse({"rm", "b", "link"}), "Nothing was removed:\n  link: " + reason);
    repository_.git({"rm", "--quiet", "--cached", "p/x"});
    EXPECT_EQ(refuse({"rm", "p"}),
              "Nothing was removed:\n  p: it has only symbolic links, which would be followed\n");
    succeed({"rm", "astray"});
    EXPECT_EQ(letters().count("astray"), 1U);
}

TEST_F(ShellChangeOfLinks, RemovesOnlyTheFilesBesideThem)
{
    repository_.symlink("../a", "p/new");
    EXPECT_EQ(fail({"rm", "p"}), "vclink-shell: Not all were removed, because a symbolic link "
                                 "would be followed:\n  p/link\n");
    EXPECT_THAT(split(repository_.git({"ls-files", "-z"}), '\0'),
                ElementsAre(".gitignore", "a", "astray", "b", "folder/c", "folder/deep/d", "link",
                            "p/link"));
}

TEST_F(ShellChangeOfLinks, AddsNoneThatLeadsSomewhere)
{
    repository_.write("file", "");
    repository_.symlink("file", "new");
    repository_.symlink("a", "other");
    EXPECT_EQ(refuse({"add", "file", "new"}),
              "Nothing was added:\n  new: it is a symbolic link, which would be followed: use "
              "\"git add\"\n");
    EXPECT_EQ(fail({"add", "."}), "vclink-shell: Others were not added, because a symbolic link "
                                  "would be followed:\n  new\n  other\n");
    EXPECT_THAT(letters(), ElementsAre(Pair("file", "A "), Pair("new", "??"), Pair("other", "??")));
}

TEST_F(ShellChangeOfLinks, MarksNoLinkAsResolved)
{
    makeLinkConflict("b", "p/x");
    EXPECT_EQ(refuse({"resolved", "link"}),
              "Nothing was marked as resolved:\n  link: it is a symbolic link, which would be "
              "followed: use \"git add\"\n");
    EXPECT_EQ(refuse({"resolved", "."}),
              "Nothing was marked as resolved:\n  .: only symbolic links are in conflict in it: "
              "use \"git add\"\n");
}

TEST_F(ShellChangeOfLinks, MarksNoLinkThatLeadsNowhereAsResolved)
{
    makeLinkConflict("no1", "no2");
    EXPECT_EQ(refuse({"resolved", "link"}),
              "Nothing was marked as resolved:\n  link: it is a symbolic link that leads nowhere, "
              "and would be removed: use \"git add\"\n");
    EXPECT_THAT(refuse({"resolved", "."}), HasSubstr("only symbolic links"));
}

TEST_F(ShellChangeOfLinks, MarksTheFilesBesideALinkAndTellsOfTheLink)
{
    repository_.write("z", "begin\n");
    repository_.commitAll("z");
    repository_.git({"branch", "other"});
    repository_.git({"checkout", "--quiet", "other"});
    lead("link", "b");
    repository_.write("z", "theirs\n");
    repository_.commitAll("theirs");
    repository_.git({"checkout", "--quiet", "main"});
    lead("link", "p/x");
    repository_.write("z", "ours\n");
    repository_.commitAll("ours");
    repository_.tryGit({"-c", "user.name=A", "-c", "user.email=a@example.org", "merge", "other"});
    const TerminalResult result = runOnTerminal(
        {"env", "TERM=dumb", VCLINK_SHELL, "-C", repository_.path().string(), "resolved", "."});
    EXPECT_EQ(result.exitStatus, 1);
    EXPECT_EQ(result.text, "Marked 1 file as resolved.\nvclink-shell: Not all were marked as "
                           "resolved, because a symbolic link would be followed:\n  link\n");
    EXPECT_EQ(letters().at("link"), "UU");
    EXPECT_EQ(letters().at("z"), "M ");
}

TEST_F(ShellChangeOfLinks, TakesNamesThatComeThroughALinkOutsideTheWorkingCopy)
{
    const std::string door = (folder().path() / "door").string();
    fs::create_directory_symlink(repository_.path(), door);
    repository_.write("a", "edited\n");
    lead("link", "b");
    succeed({"revert", door + "/a", door + "/p/../link"});
    EXPECT_THAT(letters(), IsEmpty());
}

} // namespace
} // namespace vclink::test
