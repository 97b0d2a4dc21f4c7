// SPDX-License-Identifier: MIT
// What a merge through a configured command gives, as far as tests/differential does not compare it
// with git's, and DrivenMergeHost in tests/main not see it in a host.
#include <cstdlib>
#include <filesystem>
#include <sstream>
#include <string>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "MergeDriverFixture.hpp"
#include "support/readFile.hpp"

namespace
{

using testing::ElementsAre;
using testing::HasSubstr;
using testing::Not;
using vclink::test::readFile;

using MergeDriverRun = vclink::test::MergeDriverFixture;

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

TEST_F(MergeDriverRun, GivesTemporaryFilesNamesWithoutTheFilesOwn)
{
    const std::string out = folder() / "arguments";
    makeConflict();
    define("tool", scripts_.shell("printf '%s\\n' \"$@\" >" + out) + " %O %A %B");
    EXPECT_EQ(merge(), 0);
    std::istringstream arguments(readFile(out));
    std::size_t count = 0;
    for (std::string argument; std::getline(arguments, argument); ++count)
    {
        const std::filesystem::path path = argument;
        EXPECT_EQ(path.parent_path(), environment().temporary());
        EXPECT_THAT(path.filename().string(), Not(HasSubstr("file")));
        EXPECT_THAT(path.filename().string(), Not(HasSubstr(".")));
    }
    EXPECT_EQ(count, 3U);
}

TEST_F(MergeDriverRun, FindsAPlaceholderInTheNameOfTheTemporaryFolder)
{
    const std::filesystem::path temporary = folder() / "a%Pb";
    std::filesystem::create_directory(temporary);
    ::setenv("TMPDIR", temporary.c_str(), 1);
    const std::string out = folder() / "arguments";
    makeConflict();
    define("tool", scripts_.shell("echo \"$1\" >" + out) + " %A");
    EXPECT_EQ(merge(), 0);
    EXPECT_THAT(readFile(out), testing::StartsWith(folder() / "afileb/"));
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
    EXPECT_EQ(readFile(mark), "");
}

TEST_F(MergeDriverRun, IsNotAskedForAFileThatBothHaveMovedAlike)
{
    const auto lines = [](const std::string &first)
    { return first + "\n2\n3\n4\n5\n6\n7\n8\n9\n"; };
    const auto move = [&](const std::string &side)
    {
        repository_.git({"mv", "file", "new"});
        repository_.write("new", lines(side));
    };
    diverge(
        [&]
        {
            repository_.write(".gitattributes", "* merge=tool\n");
            repository_.write("file", lines("base"));
        },
        [&] { move("ours"); }, [&] { move("theirs"); });
    const std::string mark = folder() / "mark";
    defineScript("tool", "echo run >" + mark);
    EXPECT_EQ(merge(), 0);
    EXPECT_THAT(index(), ElementsAre("100644\t0\t.gitattributes", "100644\t1\tfile",
                                     "100644\t2\tnew", "100644\t3\tnew"));
    EXPECT_EQ(readFile(mark), "");
}

TEST_F(MergeDriverRun, RunsOnceForEachFileOneAfterTheOther)
{
    makeConflicts({"a", "b", "c"}, "* merge=tool\n");
    const std::string out = folder() / "order";
    defineScript("tool", "echo \"begin $5\" >>" + out + "; test \"$5\" = b || echo \"$5\" >\"$2\"" +
                             "; echo \"end $5\" >>" + out + "; test \"$5\" != b");
    EXPECT_EQ(merge(), 0);
    EXPECT_EQ(readFile(out), "begin a\nend a\nbegin b\nend b\nbegin c\nend c\n");
    EXPECT_EQ(staged("a"), "a\n");
    EXPECT_TRUE(isInConflict("b"));
    EXPECT_EQ(staged("c"), "c\n");
}

} // namespace
