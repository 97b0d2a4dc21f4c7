// SPDX-License-Identifier: MIT
#include <algorithm>
#include <string>
#include <vector>

#include <git2/index.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "MergeFixture.hpp"
#include "error/logging/severity.hpp"
#include "main/merge/BranchMerger.hpp"
#include "support/LogCapture.hpp"

namespace
{

namespace git = vclink::git;
using testing::ElementsAre;
using testing::IsEmpty;
using namespace vclink::test;

constexpr const char *const prefix = "Conflicted entry is not mergeable: ";

/// The texts of the records about files that must not hold markers.
std::vector<std::string> unmergeableIn(const LogCapture &log)
{
    std::vector<std::string> paths;
    for (const auto &message : log.messages(git::SeverityDiagnostic))
    {
        if (message.rfind(prefix, 0) == 0)
            paths.push_back(message.substr(std::string(prefix).size()));
    }
    return paths;
}

/// How many checkouts ended.
std::size_t checkoutsIn(const LogCapture &log)
{
    std::size_t count = 0;
    for (const auto &message : log.messages(git::SeverityProgress))
    {
        if (message.rfind("Calls to chmod", 0) == 0)
            ++count;
    }
    return count;
}

/// Files in conflict whose attributes say that they must not hold markers.
class UnmergeableConflicts : public MergeFixture
{
  protected:
    void attributes(const std::string &lines)
    {
        repository_.commitAll(writes(".gitattributes", lines), "attributes");
    }
    /// Has each file changed on both sides.
    void divergeIn(const std::vector<std::string> &names)
    {
        for (const auto &name : names)
            repository_.write(name, "ancestor\n");
        repository_.commitAll("ancestor");
        Change ours = changesNothing;
        Change theirs = changesNothing;
        for (const auto &name : names)
        {
            ours = ours + writes(name, "ours of " + name + '\n');
            theirs = theirs + writes(name, "theirs of " + name + '\n');
        }
        diverge(ours, theirs);
    }
    bool isOurs(const std::string &name) const
    {
        return repository_.read(name) == "ours of " + name + '\n';
    }
    bool hasMarkers(const std::string &name) const
    {
        const std::string text = repository_.read(name);
        return text.rfind("<<<<<<< HEAD\nours of " + name + "\n=======\ntheirs of " + name +
                              "\n>>>>>>> ",
                          0) == 0;
    }
    void expectStages(const std::string &name) const
    {
        const auto stages = split(repository_.git(
            {"--literal-pathspecs", "ls-files", "--unmerged", "--format=%(stage)", "--", name}));
        EXPECT_THAT(stages, ElementsAre("1", "2", "3")) << name;
    }
};

TEST_F(UnmergeableConflicts, AreNoneAmongTextFilesAndThereIsOneCheckout)
{
    divergeIn({"file"});
    const LogCapture log(git::SeverityDiagnostic | git::SeverityProgress);
    expectConflicts("topic");
    EXPECT_TRUE(hasMarkers("file"));
    EXPECT_THAT(unmergeableIn(log), IsEmpty());
    EXPECT_EQ(checkoutsIn(log), 1U);
}

TEST_F(UnmergeableConflicts, AreNoEntriesWithoutAPath)
{
    const git_index_entry entry{};
    std::vector<ustring> paths;
    git::collectUnmergeable(adapter_->getRepository().get(), paths, &entry);
    EXPECT_THAT(paths, IsEmpty());
}

TEST_F(UnmergeableConflicts, ComeToTheSameAsInGitInASecondCheckout)
{
    attributes("file -merge\n");
    divergeIn({"file", "text"});
    const LogCapture log(git::SeverityProgress);
    expectAsGit();
    EXPECT_TRUE(isOurs("file"));
    EXPECT_TRUE(hasMarkers("text"));
    EXPECT_EQ(checkoutsIn(log), 2U);
}

TEST_F(UnmergeableConflicts, OfADriverThatGaveUpAreOurs)
{
    attributes("file -text merge=refusing\n");
    repository_.git({"config", "merge.refusing.driver", "false"});
    divergeIn({"file"});
    expectConflicts("topic");
    EXPECT_TRUE(isOurs("file"));
    expectStages("file");
}

struct AttributeCase
{
    std::string attributes;
    bool isUnmergeable;
};

TEST_F(UnmergeableConflicts, AreTheseStatesOfTheTwoAttributesAndNoOthers)
{
    const std::vector<AttributeCase> cases{{"", false},
                                           {"text", false},
                                           {"-text", false},
                                           {"text=auto", false},
                                           {"merge", false},
                                           {"merge text", false},
                                           {"merge -text", false},
                                           {"merge text=auto", false},
                                           {"-merge", true},
                                           {"-merge text", true},
                                           {"-merge -text", true},
                                           {"-merge text=auto", true},
                                           {"merge=name", false},
                                           {"merge=name text", false},
                                           {"merge=name -text", true},
                                           {"merge=name text=auto", false},
                                           {"merge=text -text", true},
                                           {"merge=binary", false},
                                           {"merge=binary -text", true},
                                           {"!merge", false},
                                           {"!merge -text", false},
                                           {"binary", true}};
    std::string lines;
    std::vector<std::string> names;
    for (std::size_t i = 0; i < cases.size(); ++i)
    {
        names.push_back("case" + std::to_string(i));
        lines += names.back() + ' ' + cases[i].attributes + '\n';
    }
    attributes(lines);
    divergeIn(names);
    const LogCapture log(git::SeverityDiagnostic);
    expectConflicts("topic");
    const auto unmergeable = unmergeableIn(log);
    for (std::size_t i = 0; i < cases.size(); ++i)
    {
        const auto records = std::count(unmergeable.begin(), unmergeable.end(), names[i]);
        EXPECT_EQ(records, cases[i].isUnmergeable ? 3 : 0) << cases[i].attributes;
        EXPECT_EQ(isOurs(names[i]), cases[i].isUnmergeable) << cases[i].attributes;
        expectStages(names[i]);
    }
}

TEST_F(UnmergeableConflicts, OfTwoStagesAreOurs)
{
    attributes("* -merge\n");
    diverge(writes("new", "ours\n") + writes("file", "ours\n") + removes("other"),
            writes("new", "theirs\n") + removes("file") + writes("other", "theirs\n"));
    const LogCapture log(git::SeverityDiagnostic);
    expectConflicts("topic");
    EXPECT_THAT(unmergeableIn(log), ElementsAre("file", "file", "new", "new", "other", "other"));
    EXPECT_THAT(conflicts(),
                ElementsAre("1 file", "2 file", "2 new", "3 new", "1 other", "3 other"));
    EXPECT_EQ(repository_.read("new"), "ours\n");
    EXPECT_EQ(repository_.read("file"), "ours\n");
}

TEST_F(UnmergeableConflicts, OfLinksAreOursAndKeepOurMode)
{
    attributes("* -merge\n");
    links("ancestor", "file")(repository_);
    repository_.commitAll("link");
    diverge(links("ours", "file") + writes("other", "ours\n") + makesExecutable("other"),
            links("theirs", "file") + writes("other", "theirs\n"));
    expectConflicts("topic");
    EXPECT_EQ(workingTreeOf(repository_),
              (RepositoryState::Entries{{".gitattributes", "644 * -merge\n"},
                                        {"file", "link to ours"},
                                        {"other", "755 ours\n"}}));
    expectStages("file");
}

/// libgit2 has put our file aside, and can't put it into the folder's place.
TEST_F(UnmergeableConflicts, WithAFolderOfTheirsInTheirPlaceTellThatInPlaceOfTheConflict)
{
    attributes("new -merge\n");
    diverge(writes("new", "ours\n"), writes("new/inside", "theirs\n"));
    const std::string head = idOf("HEAD");
    EXPECT_THAT(failureOfMerge("topic"), testing::HasSubstr("Is a directory"));
    EXPECT_THAT(conflicts(), ElementsAre("2 new"));
    EXPECT_EQ(repository_.read("new~HEAD"), "ours\n");
    EXPECT_EQ(repository_.read("new/inside"), "theirs\n");
    EXPECT_EQ(idOf("HEAD"), head);
    EXPECT_EQ(branches().getRepositoryState(), "Conflicts");
}

TEST_F(UnmergeableConflicts, FollowTheAttributesOfEachPlaceAndLeaveOtherFilesAlone)
{
    attributes("*.bin -merge\n");
    repository_.write("folder/.gitattributes", "*.in -merge\n");
    repository_.write(".git/info/attributes", "info -merge\n");
    divergeIn({"a.bin", "b.txt", "folder/c.bin", "folder/d.in", "d.in", "info", "more/e"});
    repository_.write("more/.gitattributes", "e -merge\n");
    repository_.write("untracked", "mine\n");
    expectConflicts("topic");
    for (const auto *name : {"a.bin", "folder/c.bin", "folder/d.in", "info", "more/e"})
        EXPECT_TRUE(isOurs(name)) << name;
    for (const auto *name : {"b.txt", "d.in"})
        EXPECT_TRUE(hasMarkers(name)) << name;
    EXPECT_EQ(repository_.read("untracked"), "mine\n");
}

/// The attributes of the merge's own result count, since the files are written by then.
TEST_F(UnmergeableConflicts, FollowTheAttributesThatTheirSideBrings)
{
    diverge(writes("file", "ours\n"),
            writes("file", "theirs\n") + writes(".gitattributes", "file -merge\n"));
    expectConflicts("topic");
    EXPECT_EQ(repository_.read("file"), "ours\n");
}

const std::vector<std::string> hardNames{
    "#bin", "#",     "!bin",   "!",    "*",    "a*",      "?",      "a?",    "[",
    "[ab]", "a[1]",  "[!a]",   "a b",  " a",   "a ",      "a  ",    " ",     "\t",
    "a\t",  "a\nb",  "a\n",    "\n",   "a\vb", "a\f",     "a\r",    "\r",    "a\\b",
    "\\",   "a\\",   "\\#bin", "\\*",  "\\[",  "caf\xE9", "\xFF",   "**",    "gr\xC3\xBC\xC3\x9F",
    "a]",   "{a,b}", ":a",     "f/#b", "f/*",  "#f/b",    "f/a ",   "f */x", "f[1]/x",
    "-a",   "a\\*",  "[a\\]",  "!*",   "[]",   "[^a]",    "a\r\nb", "\\!bin"};

/// What the names would mean if they were taken for patterns or comments, or cut short.
const std::vector<std::string> bystanders{"bin", "x",    "ab",   "a",    "aa", "a1",  "b",
                                          "f/b", "f/xx", "f1/x", "f2/x", "1",  "a1b", "xyz"};

/// Each name alone, all together, and names that all begin dangerously or negate: libgit2 looks
/// only below what all patterns of a list begin with.
std::vector<std::vector<std::string>> listsOfNames()
{
    std::vector<std::vector<std::string>> lists{hardNames, {"#bin", "#c"}, {"!bin", "!a"}};
    for (const auto &name : hardNames)
        lists.push_back({name});
    return lists;
}

/// The names are unmergeable, and the bystanders are in conflict as text.
class UnmergeableNames : public UnmergeableConflicts,
                         public testing::WithParamInterface<std::vector<std::string>>
{
};

TEST_P(UnmergeableNames, TouchNoOtherFileInConflict)
{
    const auto &names = GetParam();
    std::string lines = "* -merge\n";
    for (const auto &bystander : bystanders)
        lines += '/' + bystander + " merge\n";
    attributes(lines);
    auto all = bystanders;
    all.insert(all.end(), names.begin(), names.end());
    divergeIn(all);
    const LogCapture log(git::SeverityDiagnostic);
    expectConflicts("topic");
    EXPECT_EQ(unmergeableIn(log).size(), 3 * names.size());
    for (const auto &name : names)
    {
        EXPECT_TRUE(isOurs(name)) << testing::PrintToString(name);
        EXPECT_THAT(unmergeableIn(log), testing::Contains(name)) << "the plain name";
        expectStages(name);
    }
    for (const auto &bystander : bystanders)
        EXPECT_TRUE(hasMarkers(bystander)) << bystander;
}

INSTANTIATE_TEST_SUITE_P(OfEachKind, UnmergeableNames, testing::ValuesIn(listsOfNames()));

} // namespace
