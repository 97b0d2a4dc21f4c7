// SPDX-License-Identifier: MIT
#include "main/checkout/NewAttributes.hpp"

#include <chrono>
#include <filesystem>
#include <functional>
#include <ostream>
#include <string>
#include <utility>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "ObstacleFixture.hpp"
#include "support/UnprivilegedUser.hpp"
#include "support/text.hpp"

namespace
{

namespace fs = std::filesystem;
using testing::IsEmpty;
using vclink::git::isAttributesFile;
using namespace vclink::test;

/// What both branches begin with, and what "topic" changes.
struct Attributes
{
    const char *name;
    Change before;
    Change change;
    /// Whether libgit2 has looked at the files lately, because they are as new as the index.
    bool areFilesNew = false;
};

std::ostream &operator<<(std::ostream &stream, const Attributes &attributes)
{
    return stream << attributes.name << (attributes.areFilesNew ? " (new)" : "");
}

const std::string text = "one\ntwo\n";
/// On both sides of a `.gitattributes` in path order.
const Change addsFiles =
    writesEach({"-a", ".a", "a", "s/-a", "s/.a", "s/a", "s/t/a", "t/-a", "t/a"}, text);
const Change convertsLineEnds = runsGit({"config", "core.autocrlf", "true"});
const Change addsImages =
    writes("-a.png", {"P\nN\r\nG\0\1\n\n", 10}) + writes("a.png", {"P\nN\r\nG\0\1\n\n", 10});

std::vector<Attributes> allAttributes()
{
    std::vector<Attributes> rows{
        {"added", convertsLineEnds, writes(".gitattributes", "* -text\n") + addsFiles},
        {"added in a folder", convertsLineEnds,
         writes("s/.gitattributes", "* -text\n") + addsFiles},
        {"changed to CRLF", writes(".gitattributes", "* -text\n"),
         writes(".gitattributes", "* text eol=crlf\n") + addsFiles},
        {"changed to binary", writes(".gitattributes", "* text eol=crlf\n"),
         writes(".gitattributes", "* text=auto\n*.png -text\n") + addsImages + addsFiles},
        {"changed in a folder", writes("s/.gitattributes", "* -text\n"),
         writes("s/.gitattributes", "* text eol=crlf\n") + addsFiles},
        {"changed in both", writesEach({".gitattributes", "s/.gitattributes"}, "* -text\n"),
         writes(".gitattributes", "* text eol=crlf\n") +
             writes("s/.gitattributes", "*a -text\n-* text eol=crlf\n") + addsFiles},
        {"deleted", convertsLineEnds + writes(".gitattributes", "* -text\n"),
         removes(".gitattributes") + addsFiles},
        {"deleted in a folder", convertsLineEnds + writes("s/.gitattributes", "* -text\n"),
         removes("s/.gitattributes") + addsFiles},
        {"made empty", writes(".gitattributes", "* text eol=crlf\n"),
         writes(".gitattributes", "") + addsFiles},
        {"a macro",
         writes(".gitattributes", "[attr]own -text\n") + writes("s/.gitattributes", "* own\n"),
         writes(".gitattributes", "[attr]own text eol=crlf\n") + addsFiles},
        {"no macro any more",
         writes(".gitattributes", "[attr]own text eol=crlf\n") +
             writes("s/.gitattributes", "* own\n"),
         writes(".gitattributes", "* -text\n") + addsFiles},
        {"made executable", writes(".gitattributes", "* -text\n"),
         writes(".gitattributes", "* text eol=crlf\n") + makesExecutable(".gitattributes") +
             addsFiles},
        {"instead of a link", writes("s/target", "* -text\n") + links("s/target", ".gitattributes"),
         removes(".gitattributes") + writes(".gitattributes", "* text eol=crlf\n") + addsFiles},
        {"a folder", convertsLineEnds + writes(".gitattributes", "* -text\n"),
         removes(".gitattributes") + writes(".gitattributes/a", "a") + addsFiles},
        {"instead of a folder", writes(".gitattributes/a", "a"),
         removes(".gitattributes") + writes(".gitattributes", "* text eol=crlf\n") + addsFiles},
    };
    const std::size_t count = rows.size();
    for (std::size_t i = 0; i < count; ++i)
    {
        rows.push_back(rows[i]);
        rows.back().areFilesNew = true;
    }
    return rows;
}

/// Changes of `.gitattributes`, beside git's result in a twin.
class ChangedAttributes : public ObstacleFixture, public testing::WithParamInterface<Attributes>
{
  protected:
    ChangedAttributes()
    {
        repository_.commitAll(GetParam().before, "attributes");
    }
    void makeFilesOld() const
    {
        if (GetParam().areFilesNew)
            return;
        const auto then = fs::file_time_type::clock::now() - std::chrono::hours(2);
        for (auto entry = fs::recursive_directory_iterator(repository_.path());
             entry != fs::recursive_directory_iterator(); ++entry)
        {
            if (entry->path().filename() == ".git")
                entry.disable_recursion_pending();
            else if (entry->is_regular_file() && !entry->is_symlink())
                fs::last_write_time(entry->path(), then);
        }
        repository_.git({"update-index", "-q", "--refresh"});
    }
    /// Expects that `action` writes what git's command writes in a twin.
    void expectAsByGit(const std::vector<std::string> &command,
                       const std::function<void()> &action) const
    {
        makeFilesOld();
        const GitRepository twin = makeTwin();
        twin.git(command);
        action();
        EXPECT_EQ(workingTreeOf(repository_), workingTreeOf(twin));
        EXPECT_EQ(indexOf(repository_), indexOf(twin));
        EXPECT_THAT(status(), IsEmpty());
        // Not only by their times.
        repository_.git({"add", "--renormalize", "."});
        repository_.git({"add", "--all"});
        EXPECT_EQ(indexOf(repository_), indexOf(twin));
    }
};

TEST_P(ChangedAttributes, ApplyToASwitch)
{
    makeBranch("topic", GetParam().change);
    expectAsByGit({"switch", "--quiet", "topic"}, [this] { expectSwitches(); });
}

TEST_P(ChangedAttributes, ApplyToAFastForward)
{
    makeBranch("topic", GetParam().change);
    expectAsByGit({"merge", "--quiet", "topic"}, [this] { merge("topic"); });
}

TEST_P(ChangedAttributes, ApplyToAMerge)
{
    diverge(writes("ours", "x"), GetParam().change);
    expectAsByGit({"merge", "--quiet", "--no-edit", "topic"}, [this] { merge("topic"); });
    EXPECT_EQ(parents().size(), 2U);
}

INSTANTIATE_TEST_SUITE_P(Each, ChangedAttributes, testing::ValuesIn(allAttributes()));

class NewAttributes : public ObstacleFixture
{
  protected:
    NewAttributes()
    {
        repository_.commitAll(writes("d/.gitattributes", "* -text\n") + writes("d/-f", "f\n"),
                              "attributes");
    }
    const Change changes_ =
        writes("d/.gitattributes", "* text eol=crlf\n") + writesEach({"d/f", "d/g"}, "theirs\n");
};

TEST_F(NewAttributes, HaveTheNameOfAFile)
{
    for (const auto *path : {".gitattributes", "/.gitattributes", "/a/.gitattributes"})
        EXPECT_TRUE(isAttributesFile(path)) << path;
    for (const auto *path : {"", "s", "gitattributes", "a.gitattributes", "/a/a.gitattributes",
                             ".gitattributes/a", ".gitattributes2"})
        EXPECT_FALSE(isAttributesFile(path)) << path;
}

TEST_F(NewAttributes, ApplyToFilesInConflict)
{
    diverge(writes("d/f", "ours\n"), changes_);
    expectAsGit();
    EXPECT_THAT(repository_.read("d/f"), testing::HasSubstr("ours\r\n"));
}

/// libgit2 would read memory that it has released.
TEST_F(NewAttributes, InConflictCanDefineMacros)
{
    const std::string macro = "[attr]own text eol=crlf\n";
    repository_.commitAll(writes(".gitattributes", macro) + writes("d/.gitattributes", "* own\n"),
                          "macro");
    diverge(writes(".gitattributes", macro + "ours -text\n") + writes("d/f", "ours\n"),
            writes(".gitattributes", macro + "theirs -text\n") + writes("d/f", "theirs\n"));
    expectConflicts("topic");
    EXPECT_EQ(conflicts().size(), 6U);
}

TEST_F(NewAttributes, ApplyToARevert)
{
    changes_(repository_);
    removes("d/-f")(repository_);
    adapter_->revertFiles({asPath(repository_ / "d/-f"), asPath(repository_ / "d/.gitattributes"),
                           asPath(repository_ / "d/f"), asPath(repository_ / "d/g")});
    EXPECT_EQ(repository_.read("d/-f"), "f\n");
    EXPECT_EQ(repository_.read("d/f"), "f\n");
    EXPECT_EQ(repository_.read("d/.gitattributes"), "* -text\n");
    EXPECT_THAT(status(), IsEmpty());
}

TEST_F(NewAttributes, ApplyInAFolderThatCannotBeWrittenTo)
{
    makeBranch("topic", changes_);
    repository_.git({"config", "--global", "safe.directory", "*"});
    giveToUnprivilegedUser(folder().path());
    repository_.setMode("d", 0555);
    runAsUnprivilegedUser(
        [this]
        {
            branches().switchBranch("topic");
            return std::string();
        });
    repository_.setMode("d", 0755);
    EXPECT_EQ(repository_.read("d/f"), "theirs\r\n");
    EXPECT_EQ(repository_.read("d/.gitattributes"), "* text eol=crlf\r\n");
}

TEST_F(NewAttributes, LeaveTheOldOnesIfTheCheckoutIsRefused)
{
    makeBranch("topic", changes_);
    repository_.write("d/g", "edited\n");
    expectNothingChanges([this] { failureOf([this] { branches().switchBranch("topic"); }); });
}

} // namespace
