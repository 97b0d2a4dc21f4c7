// SPDX-License-Identifier: MIT
// What a merge through a configured command gives.
#include <algorithm>
#include <cstddef>
#include <filesystem>
#include <ostream>
#include <sstream>
#include <string>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "MergeDriverFixture.hpp"

namespace
{

using testing::ElementsAre;
using testing::HasSubstr;
using vclink::test::Scripts;

class MergeDriverRun : public vclink::test::MergeDriverFixture
{
  protected:
    /// The words that the command of the conflict in "file" was given.
    std::string argumentsOf(const std::string &words)
    {
        const std::string out = folder() / "arguments";
        makeConflict();
        define("tool", scripts_.shell("printf '%s|' \"$@\" >" + out) + ' ' + words);
        EXPECT_EQ(merge(), 0);
        return Scripts::read(out);
    }
};

TEST_F(MergeDriverRun, WorksUnderAnyNameThatHasAKey)
{
    for (const char *name : {"vkAutoMerge", "x", "with-dash", "with.dot", "Upper", "driver"})
    {
        SCOPED_TRACE(name);
        repository_ = makeRepository(std::string("repository-") + name);
        makeConflict(name);
        defineScript(name, "echo merged >\"$2\"");
        EXPECT_EQ(merge(), 0);
        EXPECT_EQ(staged("file"), "merged\n");
    }
}

TEST_F(MergeDriverRun, LeavesAConflictWhenTheCommandSaysSo)
{
    for (const int status : {1, 2, 127, 255})
    {
        repository_ = makeRepository("repository-" + std::to_string(status));
        makeConflict();
        defineScript("tool", "echo dropped >\"$2\"; exit " + std::to_string(status));
        EXPECT_EQ(merge(), 0);
        EXPECT_THAT(index(), ElementsAre("100644\t0\t.gitattributes", "100644\t1\tfile",
                                         "100644\t2\tfile", "100644\t3\tfile"));
        EXPECT_EQ(staged("file", 2), "ours\n");
        // libgit2's own merge, and not what the command has left.
        EXPECT_THAT(repository_.read("file"), HasSubstr("<<<<<<<"));
    }
}

TEST_F(MergeDriverRun, LeavesAConflictWhenASignalEndsTheCommand)
{
    makeConflict();
    defineScript("tool", "kill -9 $$");
    EXPECT_EQ(merge(), 0);
    EXPECT_TRUE(isInConflict("file"));
}

/// A command, and what the merge makes of the file.
struct RunCase
{
    const char *sentence;
    const char *script;
    std::string merged;
};

std::ostream &operator<<(std::ostream &stream, const RunCase &run)
{
    return stream << run.script;
}

class MergeDriverResult : public MergeDriverRun, public testing::WithParamInterface<RunCase>
{
};

TEST_P(MergeDriverResult, Is)
{
    makeConflict();
    defineScript("tool", GetParam().script);
    EXPECT_EQ(merge(), 0);
    EXPECT_FALSE(isInConflict("file"));
    EXPECT_EQ(staged("file"), GetParam().merged);
    EXPECT_EQ(repository_.read("file"), GetParam().merged);
}

const RunCase runResults[]{
    {"WhatTheCommandWroteToTheFileOfOurs", "cat \"$1\" \"$3\" >>\"$2\"", "ours\nbase\ntheirs\n"},
    {"OursIfTheCommandDoesNothing", ":", "ours\n"},
    {"EmptyIfTheCommandRemovesOurs", "rm \"$2\"", ""},
    {"EmptyIfTheCommandEmptiesOurs", ": >\"$2\"", ""},
    {"AFileThatTheCommandHasPutInThePlaceOfOurs", "echo other >\"$2.new\"; mv \"$2.new\" \"$2\"",
     "other\n"},
    {"TheBytesAsTheyAre", "printf 'a\\r\\n\\000\\377\\r' >\"$2\"", std::string("a\r\n\0\377\r", 6)},
};

INSTANTIATE_TEST_SUITE_P(TheMerge, MergeDriverResult, testing::ValuesIn(runResults),
                         [](const auto &test) { return test.param.sentence; });

TEST_F(MergeDriverRun, GivesTheCommandTheThreeSides)
{
    const std::string out = folder() / "sides";
    makeConflict();
    defineScript("tool", "cat \"$1\" \"$2\" \"$3\" >" + out);
    EXPECT_EQ(merge(), 0);
    EXPECT_EQ(Scripts::read(out), "base\nours\ntheirs\n");
}

TEST_F(MergeDriverRun, GivesTheMarkerSizeAndThePath)
{
    // libgit2 tells 0 where nobody asks for another size.
    EXPECT_EQ(argumentsOf("%L %P"), "0|file|");
}

TEST_F(MergeDriverRun, GivesAPathThatHasABlankAsTwoWords)
{
    makeConflicts({"a folder/file"}, "* merge=tool\n");
    const std::string out = folder() / "arguments";
    define("tool", scripts_.shell("printf '%s|' \"$@\" >" + out) + " %P \"%P\"");
    EXPECT_EQ(merge(), 0);
    EXPECT_EQ(Scripts::read(out), "a|folder/file|a folder/file|");
}

TEST_F(MergeDriverRun, ReplacesAPlaceholderWhereverItStands)
{
    const std::string arguments = argumentsOf("%O %A %B %A");
    EXPECT_EQ(std::count(arguments.begin(), arguments.end(), '|'), 4);
    const std::string temporary = environment().temporary().string() + '/';
    EXPECT_EQ(arguments.compare(0, temporary.size(), temporary), 0) << arguments;
}

TEST_F(MergeDriverRun, GivesTemporaryFilesNamesWithoutTheFilesOwn)
{
    std::istringstream arguments(argumentsOf("%O %A %B"));
    std::size_t count = 0;
    for (std::string argument; std::getline(arguments, argument, '|'); ++count)
    {
        const std::string name = std::filesystem::path(argument).filename();
        EXPECT_THAT(name, testing::Not(HasSubstr("file")));
        EXPECT_THAT(name, testing::Not(HasSubstr(".")));
    }
    EXPECT_EQ(count, 3U);
}

TEST_F(MergeDriverRun, RemovesTheTemporaryFilesInTheEnd)
{
    makeConflict();
    const std::string out = folder() / "names";
    defineScript("tool", "ls \"$1\" \"$2\" \"$3\" >" + out);
    EXPECT_EQ(merge(), 0);
    const std::string names = Scripts::read(out);
    EXPECT_EQ(std::count(names.begin(), names.end(), '\n'), 3);
    EXPECT_TRUE(std::filesystem::is_empty(environment().temporary()));
}

TEST_F(MergeDriverRun, IsNotAskedForAFileThatBothHaveAdded)
{
    diverge([this] { repository_.write(".gitattributes", "* merge=tool\n"); },
            [this] { repository_.write("file", "ours\n"); },
            [this] { repository_.write("file", "theirs\n"); });
    const std::string mark = folder() / "mark";
    defineScript("tool", "echo run >" + mark);
    EXPECT_EQ(merge(), 0);
    EXPECT_TRUE(isInConflict("file"));
    EXPECT_EQ(Scripts::read(mark), "");
}

TEST_F(MergeDriverRun, LeavesAFileThatOneSideHasRemovedInConflict)
{
    diverge(
        [this]
        {
            repository_.write(".gitattributes", "* merge=tool\n");
            repository_.write("ours", "base\n");
            repository_.write("theirs", "base\n");
        },
        [this]
        {
            repository_.remove("ours");
            repository_.write("theirs", "ours\n");
        },
        [this]
        {
            repository_.remove("theirs");
            repository_.write("ours", "theirs\n");
        });
    defineScript("tool", "echo merged >\"$2\"");
    EXPECT_EQ(merge(), 0);
    EXPECT_TRUE(isInConflict("ours"));
    EXPECT_TRUE(isInConflict("theirs"));
}

TEST_F(MergeDriverRun, LeavesANameWithoutACommandToTheTextMerge)
{
    diverge(
        [this]
        {
            repository_.write(".gitattributes", "* merge=absent\n");
            repository_.write("file", "1\n2\n3\n4\n5\n");
        },
        [this] { repository_.write("file", "ours\n2\n3\n4\n5\n"); },
        [this] { repository_.write("file", "1\n2\n3\n4\ntheirs\n"); });
    EXPECT_EQ(merge(), 0);
    EXPECT_FALSE(isInConflict("file"));
    EXPECT_EQ(staged("file"), "ours\n2\n3\n4\ntheirs\n");
}

TEST_F(MergeDriverRun, IsNotAskedForLibGit2sOwnDrivers)
{
    const std::string mark = folder() / "mark";
    for (const char *attribute :
         {"merge=text", "merge=union", "merge=binary", "-merge", "!merge", "merge", "text"})
    {
        SCOPED_TRACE(attribute);
        repository_ = makeRepository(std::string("repository") + attribute);
        makeConflict();
        repository_.write(".git/info/attributes", std::string("file ") + attribute + '\n');
        for (const char *name : {"text", "union", "binary", "*", "true", "false"})
            defineScript(name, "echo run >" + mark);
        const vclink::test::LogCapture log(0x02);
        EXPECT_EQ(merge(), 0);
        const bool asked = std::string(attribute) == "text";
        EXPECT_THAT(log.messages(), testing::SizeIs(asked ? 1 : 0));
    }
    EXPECT_EQ(Scripts::read(mark), "");
}

TEST_F(MergeDriverRun, IsAskedForASymbolicLinksTarget)
{
    diverge(
        [this]
        {
            repository_.write(".gitattributes", "* merge=tool\n");
            repository_.symlink("base", "link");
        },
        [this]
        {
            repository_.remove("link");
            repository_.symlink("ours", "link");
        },
        [this]
        {
            repository_.remove("link");
            repository_.symlink("theirs", "link");
        });
    defineScript("tool", "printf merged >\"$2\"");
    EXPECT_EQ(merge(), 0);
    EXPECT_THAT(index(), ElementsAre("100644\t0\t.gitattributes", "120000\t0\tlink"));
    EXPECT_EQ(std::filesystem::read_symlink(repository_ / "link"), "merged");
}

TEST_F(MergeDriverRun, RunsOnceForEachFileOneAfterTheOther)
{
    makeConflicts({"a", "b", "c"}, "* merge=tool\n");
    const std::string out = folder() / "order";
    defineScript("tool", "echo \"begin $5\" >>" + out + "; test \"$5\" = b || echo \"$5\" >\"$2\"" +
                             "; echo \"end $5\" >>" + out + "; test \"$5\" != b");
    EXPECT_EQ(merge(), 0);
    EXPECT_EQ(Scripts::read(out), "begin a\nend a\nbegin b\nend b\nbegin c\nend c\n");
    EXPECT_EQ(staged("a"), "a\n");
    EXPECT_TRUE(isInConflict("b"));
    EXPECT_EQ(staged("c"), "c\n");
}

/// Enough lines for a rename to be found.
std::string content(const std::string &first)
{
    return first + "\n2\n3\n4\n5\n6\n7\n8\n9\n10\n";
}

struct Side
{
    std::string name = "file";
    unsigned mode = 0644;
};

/// The sides of a file, and its entries in the index that the merge makes, each mode, stage and
/// name.
struct SidesCase
{
    const char *sentence;
    Side ours;
    Side theirs;
    std::vector<std::string> entries;
    /// what the command is told; empty if it is not asked
    std::string path;
    unsigned baseMode = 0644;
};

std::ostream &operator<<(std::ostream &stream, const SidesCase &sides)
{
    return stream << sides.ours.name << " and " << sides.theirs.name;
}

class MergeDriverPath : public vclink::test::MergeDriverFixture,
                        public testing::WithParamInterface<SidesCase>
{
  protected:
    /// Merges a file that each side has edited, and moved or made executable as told.
    void mergeSides(const Side &ours, const Side &theirs, unsigned baseMode)
    {
        const auto edit = [this](const Side &side, const std::string &first)
        {
            if (side.name != "file")
                repository_.git({"mv", "file", side.name});
            repository_.write(side.name, content(first));
            repository_.setMode(side.name, side.mode);
        };
        diverge(
            [&]
            {
                repository_.write(".gitattributes", "* merge=tool\n");
                repository_.write("file", content("base"));
                repository_.setMode("file", baseMode);
            },
            [&] { edit(ours, "ours"); }, [&] { edit(theirs, "theirs"); });
        defineScript("tool", "echo \"$5\" >" + path_ + "; echo merged >\"$2\"");
        EXPECT_EQ(merge(), 0);
    }

    std::string path_ = folder() / "path";
};

TEST_P(MergeDriverPath, AndModeAre)
{
    mergeSides(GetParam().ours, GetParam().theirs, GetParam().baseMode);
    std::vector<std::string> expected{"100644\t0\t.gitattributes"};
    expected.insert(expected.end(), GetParam().entries.begin(), GetParam().entries.end());
    EXPECT_EQ(index(), expected);
    EXPECT_EQ(Scripts::read(path_), GetParam().path);
    if (!GetParam().path.empty())
    {
        EXPECT_EQ(staged(expected.back().substr(9)), "merged\n");
    }
}

const SidesCase mergedSides[]{
    {"TheOnes", {}, {}, {"100644\t0\tfile"}, "file\n"},
    {"TheNameThatTheirsHasGiven", {}, {"new", 0644}, {"100644\t0\tnew"}, "new\n"},
    {"TheNameThatOursHasGiven", {"new", 0644}, {}, {"100644\t0\tnew"}, "new\n"},
    {"TheModeThatTheirsHasGiven", {}, {"file", 0755}, {"100755\t0\tfile"}, "file\n"},
    {"TheModeThatOursHasGiven", {"file", 0755}, {}, {"100755\t0\tfile"}, "file\n"},
    {"WithoutTheExecutableBitThatOneSideHasTaken",
     {"file", 0644},
     {"file", 0755},
     {"100644\t0\tfile"},
     "file\n",
     0755},
    {"TheNameOfOursAndTheModeOfTheirs", {"new", 0644}, {"file", 0755}, {"100755\t0\tnew"}, "new\n"},
    {"TheModeOfOursAndTheNameOfTheirs", {"file", 0755}, {"new", 0644}, {"100755\t0\tnew"}, "new\n"},
    {"InConflictIfBothHaveMovedTheFile",
     {"new", 0644},
     {"new", 0644},
     {"100644\t1\tfile", "100644\t2\tnew", "100644\t3\tnew"},
     ""},
};

INSTANTIATE_TEST_SUITE_P(TheMerged, MergeDriverPath, testing::ValuesIn(mergedSides),
                         [](const auto &test) { return test.param.sentence; });

} // namespace
