// SPDX-License-Identifier: MIT
// The driver's records in the log, and the order in which it cleans up.
#include <filesystem>
#include <string>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "MergeDriverFixture.hpp"
#include "support/readFile.hpp"

namespace
{

namespace fs = std::filesystem;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::StartsWith;
using namespace vclink::test;

const std::string signature =
    "int {anonymous}::wildcardGitDriverApplyCallback(git_merge_driver*, const char**, uint32_t*, "
    "git_buf*, const char*, const git_merge_driver_source*)";

class MergeDriverRecords : public MergeDriverFixture
{
  protected:
    /// Records as "severity message".
    std::vector<std::string> allRecords() const
    {
        const LogCapture log;
        EXPECT_EQ(merge(), 0);
        std::vector<std::string> lines;
        for (const LogRecord &record : log.records())
            lines.push_back(std::to_string(record.severity) + ' ' + record.message);
        return lines;
    }
};

TEST_F(MergeDriverRecords, TellOfASuccess)
{
    makeConflict();
    const std::string names = folder() / "names";
    const std::string program =
        scripts_.shell("echo \"$*\" >" + names + "; echo out\n" +
                       "until grep -q '^State:.S' /proc/$PPID/status; do :; done");
    define("tool", program + " %A %B %O %L %P");
    const auto records = allRecords();
    std::string expanded = program + ' ' + readFile(names);
    expanded.pop_back();
    EXPECT_THAT(records, ElementsAre("32 " + signature, "2  filter_name=tool",
                                     "8 merge.tool.driver " + program + " %A %B %O %L %P",
                                     "8 Command: " + expanded, "8 Output:\nout",
                                     "8 Auto-merge successful", "64 " + signature));
}

TEST_F(MergeDriverRecords, TellOfARefusalAndOfANameWithoutACommand)
{
    makeConflict();
    EXPECT_THAT(allRecords(),
                ElementsAre("32 " + signature, "2  filter_name=tool",
                            "512 Merge driver merge.tool.driver not found", "64 " + signature));
    repository_.git({"reset", "--quiet", "--hard"});
    const std::string program = scripts_.shell("exit 1");
    define("tool", program);
    EXPECT_THAT(allRecords(),
                ElementsAre("32 " + signature, "2  filter_name=tool",
                            "8 merge.tool.driver " + program, "8 Command: " + program,
                            "8 Output:\n", "8 Auto-merge unsuccessful", "64 " + signature));
}

TEST_F(MergeDriverRecords, TellTheNameAsConfigurationSpellsIt)
{
    makeConflict("Tool");
    const std::string program = scripts_.shell("exit 0");
    repository_.git({"config", "MERGE.Tool.DRIVER", program});
    const LogCapture log(0x08);
    EXPECT_EQ(merge(), 0);
    EXPECT_EQ(log.messages().at(0), "merge.Tool.driver " + program);
}

TEST_F(MergeDriverRecords, TellOfAFileThatBothHaveAdded)
{
    diverge([this] { repository_.write(".gitattributes", "* merge=tool\n"); },
            [this] { repository_.write("file", "ours\n"); },
            [this] { repository_.write("file", "theirs\n"); });
    defineScript("tool", "exit 0");
    EXPECT_THAT(allRecords(), ElementsAre("32 " + signature, "2  filter_name=tool",
                                          "8 base is nullptr", "64 " + signature));
}

TEST_F(MergeDriverRecords, TellOfAnException)
{
    makeConflict();
    define("tool", "/nowhere/tool");
    const LogCapture log;
    EXPECT_THROW(mergeOrThrow(), std::exception);
    const auto records = log.records();
    ASSERT_GE(records.size(), 8U);
    std::vector<unsigned> severities;
    for (const LogRecord &record : records)
        severities.push_back(record.severity);
    // The last four are those of the code that takes the exception out of the slot.
    EXPECT_THAT(severities,
                ElementsAre(0x20U, 0x02U, 0x08U, 0x08U, 0x40U, 0x10U, 0x200U, 0x20U, 0x08U, 0x40U));
    EXPECT_EQ(records[3].message, "Command: /nowhere/tool");
    EXPECT_EQ(records[4].message, signature + " [throw]");
    EXPECT_THAT(records[5].message, StartsWith("Exception caught: "));
    EXPECT_THAT(records[5].message, testing::HasSubstr("process_error"));
    EXPECT_FALSE(records[6].message.empty());
    EXPECT_EQ(records[8].message, "Re-throwing error from callback");
}

TEST_F(MergeDriverRecords, ComeBeforeTheCommandHasItsFiles)
{
    makeConflict();
    defineScript("tool", "exit 0");
    LogCapture log;
    std::vector<std::size_t> files;
    log.onRecord(
        [&](const LogRecord &)
        {
            const fs::directory_iterator entries(environment().temporary());
            files.push_back(static_cast<std::size_t>(std::distance(begin(entries), end(entries))));
        });
    EXPECT_EQ(merge(), 0);
    // Entry, parameter, configured command; command, output, success; exit.
    EXPECT_THAT(files, ElementsAre(0U, 0U, 0U, 3U, 3U, 3U, 0U));
}

TEST_F(MergeDriverRecords, TellOfTemporaryFilesThatCannotBeRemovedTheLastOneFirst)
{
    makeConflict();
    const std::string names = folder() / "names";
    defineScript("tool", "printf '%s\\n' \"$3\" \"$2\" \"$1\" >" + names +
                             "; for f in \"$1\" \"$2\" \"$3\"; do rm \"$f\"; mkdir -p "
                             "\"$f/sub\"; done; exit 1");
    std::vector<std::string> texts;
    {
        LogCapture log(0x210);
        log.onRecord([&](const LogRecord &record) { texts.push_back(record.message); });
        EXPECT_EQ(merge(TemporaryFiles::Stay), 0);
    }
    ASSERT_EQ(texts.size(), 6U);
    std::string told;
    for (std::size_t i = 0; i < texts.size(); i += 2)
    {
        EXPECT_THAT(texts[i], StartsWith("Exception caught: "));
        const std::string beginning = "Could not remove temporary file: ";
        EXPECT_THAT(texts[i + 1], StartsWith(beginning));
        told += texts[i + 1].substr(beginning.size()) + '\n';
    }
    EXPECT_EQ(told, readFile(names));
    EXPECT_TRUE(isInConflict("file"));
}

TEST_F(MergeDriverRecords, TellNothingOfTemporaryFilesThatAreGoneOrOfSeveritiesThatAreNotEnabled)
{
    makeConflict();
    defineScript("tool", "rm \"$1\" \"$2\" \"$3\"");
    for (const unsigned severities : {0x210u, 0u})
    {
        const LogCapture log(severities);
        EXPECT_EQ(merge(), 0);
        EXPECT_THAT(log.messages(), IsEmpty());
        repository_.git({"reset", "--quiet", "--hard"});
    }
}

} // namespace
