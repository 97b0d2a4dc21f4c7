// SPDX-License-Identifier: MIT
// The tools that the stand-in ships at the place below the installation that is agreed on.
#include <filesystem>
#include <string>

#include <gtest/gtest.h>

#include "support/Command.hpp"
#include "support/Files.hpp"

using vclink::test::Command;
using vclink::test::CommandResult;
using namespace vclink_host_tests;

namespace
{

std::string launcher(const std::string &name)
{
    return std::string(VCLINK_STAGE_DIR) + "/bin/lnxhost/" + name;
}

class StandInLaunchers : public testing::Test
{
  protected:
    StandInLaunchers()
    {
        std::filesystem::create_directory(temporary_);
    }

    /// Runs a launcher with files of the folder as its arguments.
    template <class... Names> CommandResult run(const std::string &path, const Names &...names)
    {
        return Command({path, folder_.file(names)...}).run();
    }
    void writeSides(const std::string &ours, const std::string &theirs) const
    {
        folder_.write("base", "1\n2\n3\n4\n5\n");
        folder_.write("ours", ours);
        folder_.write("theirs", theirs);
    }
    std::string read(const std::string &name) const
    {
        return folder_.read(name);
    }
    bool nothingIsLeft() const
    {
        return std::filesystem::is_empty(temporary_);
    }

    const Folder folder_;

  private:
    const std::string temporary_ = folder_.file("tmp with a blank");
    const ScopedVariable variable_{"TMPDIR", temporary_.c_str()};
};

const std::string clean = "ours\n2\n3\n4\ntheirs\n";

TEST_F(StandInLaunchers, CanBeExecuted)
{
    for (const auto *name : {"vkAutoMerge.sh", "vkMerge", "vkDiff"})
    {
        const auto status = std::filesystem::status(launcher(name));
        EXPECT_TRUE(std::filesystem::is_regular_file(status)) << name;
        EXPECT_EQ(status.permissions() & std::filesystem::perms::others_exec,
                  std::filesystem::perms::others_exec)
            << name;
    }
}

TEST_F(StandInLaunchers, MergeIntoOneOfTheSides)
{
    writeSides("ours\n2\n3\n4\n5\n", "1\n2\n3\n4\ntheirs\n");
    EXPECT_EQ(run(launcher("vkAutoMerge.sh"), "base", "ours", "theirs", "ours").exitStatus, 0);
    EXPECT_EQ(read("ours"), clean);
    EXPECT_EQ(read("base"), "1\n2\n3\n4\n5\n");
    EXPECT_EQ(read("theirs"), "1\n2\n3\n4\ntheirs\n");
    EXPECT_TRUE(nothingIsLeft());
}

TEST_F(StandInLaunchers, MergeIntoAFourthFile)
{
    for (const auto *name : {"vkAutoMerge.sh", "vkMerge"})
    {
        writeSides("ours\n2\n3\n4\n5\n", "1\n2\n3\n4\ntheirs\n");
        folder_.write("merged", "with markers\n");
        EXPECT_EQ(run(launcher(name), "base", "ours", "theirs", "merged").exitStatus, 0) << name;
        EXPECT_EQ(read("merged"), clean) << name;
        EXPECT_EQ(read("ours"), "ours\n2\n3\n4\n5\n") << name;
    }
}

TEST_F(StandInLaunchers, TellConflictsAndLeaveTheResultAsItIs)
{
    for (const auto *name : {"vkAutoMerge.sh", "vkMerge"})
    {
        writeSides("ours\n", "theirs\n");
        folder_.write("merged", "as it was\n");
        EXPECT_GT(run(launcher(name), "base", "ours", "theirs", "merged").exitStatus, 0) << name;
        EXPECT_EQ(read("merged"), "as it was\n") << name;
        EXPECT_TRUE(nothingIsLeft()) << name;
    }
}

TEST_F(StandInLaunchers, TellConflictsOfBinaryFiles)
{
    writeSides(std::string("ours\0", 5), std::string("theirs\0", 7));
    EXPECT_GT(run(launcher("vkAutoMerge.sh"), "base", "ours", "theirs", "ours").exitStatus, 0);
    EXPECT_EQ(read("ours"), std::string("ours\0", 5));
    EXPECT_TRUE(nothingIsLeft());
}

TEST_F(StandInLaunchers, TellAFileThatIsMissing)
{
    writeSides("ours\n", "theirs\n");
    for (const auto *name : {"vkAutoMerge.sh", "vkMerge"})
    {
        EXPECT_GT(run(launcher(name), "missing", "ours", "theirs", "ours").exitStatus, 0) << name;
        EXPECT_EQ(read("ours"), "ours\n") << name;
    }
    EXPECT_GT(run(launcher("vkDiff"), "missing", "ours").exitStatus, 0);
}

TEST_F(StandInLaunchers, ShowWhatIsDifferentAndNothingOfEqualFiles)
{
    writeSides("1\n2\n3\nours\n5\n", "1\n2\n3\n4\n5\n");
    const CommandResult result = run(launcher("vkDiff"), "base", "ours");
    EXPECT_EQ(result.exitStatus, 0);
    EXPECT_EQ(result.output, "--- " + folder_.file("base") + "\n+++ " + folder_.file("ours") +
                                 "\n@@ -1,5 +1,5 @@\n 1\n 2\n 3\n-4\n+ours\n 5\n");
    const CommandResult equal = run(launcher("vkDiff"), "base", "theirs");
    EXPECT_EQ(equal.exitStatus, 0);
    EXPECT_EQ(equal.output, "");
}

/// As the settings of the tools have it.
TEST_F(StandInLaunchers, TakeAWorkingFolderFromBeforeAnAbsoluteName)
{
    writeSides("ours\n2\n3\n4\n5\n", "1\n2\n3\n4\ntheirs\n");
    const std::string before = std::filesystem::current_path().string() + '/';
    const CommandResult merged =
        Command({launcher("vkMerge"), before + folder_.file("base"), before + folder_.file("ours"),
                 before + folder_.file("theirs"), before + folder_.file("a new file")})
            .run();
    EXPECT_EQ(merged.exitStatus, 0) << merged.errors;
    EXPECT_EQ(read("a new file"), clean);
    const CommandResult different =
        Command({launcher("vkDiff"), folder_.file("base"), before + folder_.file("ours")}).run();
    EXPECT_EQ(different.exitStatus, 0) << different.errors;
    EXPECT_NE(different.output.find("+++ " + folder_.file("ours") + '\n'), std::string::npos);
    EXPECT_EQ(
        Command({launcher("vkDiff"), folder_.file("base"), before + "/dev/null"}).run().exitStatus,
        0);
}

TEST_F(StandInLaunchers, LeaveOtherDoubleSlashesInNames)
{
    writeSides("ours\n", "");
    std::filesystem::create_directory(folder_.file("in"));
    folder_.write("in/file", "1\n");
    EXPECT_NE(run(launcher("vkDiff"), "base", "in//file").output.find("in//file\n"),
              std::string::npos);
}

TEST_F(StandInLaunchers, ShowWhatIsDifferentInFolders)
{
    for (const std::string name : {"left", "right"})
        std::filesystem::create_directory(folder_.file(name));
    folder_.write("left/a file", "1\n");
    folder_.write("right/a file", "2\n");
    folder_.write("right/new", "new\n");
    const CommandResult result = run(launcher("vkDiff"), "left", "right");
    EXPECT_EQ(result.exitStatus, 0);
    EXPECT_NE(result.output.find("\n-1\n+2\n"), std::string::npos) << result.output;
    EXPECT_NE(result.output.find("\n+new\n"), std::string::npos) << result.output;
}

TEST_F(StandInLaunchers, WantTheirNumberOfArguments)
{
    writeSides("ours\n", "theirs\n");
    EXPECT_EQ(run(launcher("vkAutoMerge.sh"), "base", "ours", "theirs").exitStatus, 2);
    EXPECT_EQ(run(launcher("vkMerge")).exitStatus, 2);
    EXPECT_EQ(run(launcher("vkMerge"), "base", "ours", "theirs", "ours", "more").exitStatus, 2);
    EXPECT_EQ(run(launcher("vkDiff"), "base").exitStatus, 2);
    EXPECT_EQ(run(launcher("vkDiff")).errors, "usage: vkDiff LOCAL REMOTE\n");
    EXPECT_EQ(read("ours"), "ours\n");
}

TEST_F(StandInLaunchers, WorkBelowAFolderWithABlank)
{
    const std::string copy = folder_.file("my host");
    std::filesystem::create_directory(copy);
    for (const auto *name : {"vkAutoMerge.sh", "vkMerge"})
        std::filesystem::copy_file(launcher(name), copy + '/' + name);
    writeSides("ours\n2\n3\n4\n5\n", "1\n2\n3\n4\ntheirs\n");
    EXPECT_EQ(run(copy + "/vkMerge", "base", "ours", "theirs", "a new file").exitStatus, 0);
    EXPECT_EQ(read("a new file"), clean);
}

} // namespace
