// SPDX-License-Identifier: MIT
// Where a command without a slash is looked for: as execvpe(3) does.
#include <cerrno>
#include <cstdlib>
#include <filesystem>
#include <map>
#include <string>
#include <system_error>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "RunCommandFixture.hpp"
#include "support/WorkingFolder.hpp"
#include "support/readFile.hpp"
#include "util/command/programLookup.hpp"

namespace
{

namespace fs = std::filesystem;
using testing::ElementsAre;
using vclink::test::WorkingFolder;

class ProgramLookup : public vclink::test::RunCommandFixture
{
  protected:
    ProgramLookup()
    {
        fs::create_directories(folder() / "here");
    }

    /// Puts something called "tool" into a folder below the fixture's; "here" is the working
    /// folder.
    /// @param kind "folder", "file", or the status with which a program ends
    void place(const std::string &name, const std::string &kind)
    {
        const fs::path path = folder() / name / "tool";
        fs::create_directories(kind == "folder" ? path : path.parent_path());
        if (kind == "folder")
            return;
        fs::copy(scripts_.shell("exit " + (kind == "file" ? "99" : kind)), path);
        if (kind == "file")
            fs::permissions(path, fs::perms::owner_read | fs::perms::owner_write);
    }

    /// Sets PATH, with every '@' replaced by the fixture's folder.
    void setPath(const std::string &pattern)
    {
        std::string path;
        for (const char character : pattern)
            path += character == '@' ? folder().path().string() : std::string(1, character);
        ::setenv("PATH", path.c_str(), 1);
    }

    std::string named(const std::string &command) const
    {
        const WorkingFolder there(folder() / "here");
        std::error_code error;
        std::string result = vclink::git::nameProgram(command, error);
        EXPECT_FALSE(error) << error.message();
        return result;
    }
    int errorOf(const std::string &command) const
    {
        const WorkingFolder there(folder() / "here");
        return run(command).error.value();
    }
};

struct LookupRow
{
    const char *what;
    std::map<std::string, std::string> placed; ///< what, by folder
    const char *path;
    int status; ///< of the program that runs, which is never 99
    int error = 0;
};

const std::vector<LookupRow> &lookupRows()
{
    static const std::vector<LookupRow> table{
        {"the first folder of PATH", {{"a", "1"}}, "@/a:@/b", 1},
        {"the only folder of PATH", {{"a", "1"}}, "@/a", 1},
        {"a later folder of PATH", {{"b", "2"}}, "@/a:@/b", 2},
        {"the first of two", {{"a", "1"}, {"b", "99"}}, "@/a:@/b", 1},
        {"the second of three", {{"b", "2"}, {"c", "99"}}, "@/a:@/b:@/c", 2},
        {"not the working folder", {{"here", "99"}, {"b", "2"}}, "@/a:@/b", 2},
        {"not the working folder, with nothing in PATH", {{"here", "99"}}, "@/a:@/b", -1, ENOENT},
        {"not a folder of the working folder", {{"here", "folder"}, {"b", "2"}}, "@/a:@/b", 2},
        {"not what lies in a folder named like the variable",
         {{"here/PATH=a", "99"}, {"b", "2"}},
         "a:@/b",
         2},
        {"the working folder, by an empty first element", {{"here", "3"}, {"b", "99"}}, ":@/b", 3},
        {"the working folder, by an empty element in the middle",
         {{"here", "3"}, {"b", "99"}},
         "@/a::@/b",
         3},
        {"the working folder, by an empty last element", {{"here", "3"}}, "@/a:", 3},
        {"the working folder, by an empty PATH", {{"here", "3"}}, "", 3},
        {"the working folder, by a dot", {{"here", "3"}}, "@/a:.", 3},
        {"a folder before an empty element", {{"here", "99"}, {"a", "1"}}, "@/a:", 1},
        {"a relative folder", {{"here/bin", "4"}}, "@/a:bin", 4},
        {"a relative first folder", {{"here/bin", "4"}}, "bin:@/a", 4},
        {"a folder with blanks", {{"a b  c", "5"}}, "@/a b  c:@/b", 5},
        {"a later folder with blanks", {{"a b", "5"}}, "@/a:@/a b", 5},
        {"a folder with a double quote", {{"a\"b", "99"}}, "@/a\"b", -1, EINVAL},
        {"a later folder with a double quote", {{"a\"b", "5"}}, "@/b:@/a\"b", 5},
        {"not a folder of that name", {{"a", "folder"}, {"b", "2"}}, "@/a:@/b", 2},
        {"not a later folder of that name", {{"b", "folder"}, {"c", "2"}}, "@/a:@/b:@/c", 2},
        {"nothing but a folder of that name", {{"b", "folder"}}, "@/a:@/b", -1, EACCES},
        {"not a file that may not be executed", {{"a", "file"}, {"b", "2"}}, "@/a:@/b", 2},
        {"nothing but a file that may not be executed", {{"a", "file"}}, "@/a:@/b", -1, EACCES},
        {"not a file of the working folder that may not be executed",
         {{"here", "file"}, {"b", "2"}},
         "@/a:@/b",
         2},
        {"not an element that is a file", {{"a", "file"}, {"b", "2"}}, "@/a/tool:@/b", 2},
        {"nothing", {}, "@/a:@/b", -1, ENOENT},
    };
    return table;
}

TEST_F(ProgramLookup, IsThatOfExecvpe)
{
    for (const LookupRow &row : lookupRows())
    {
        for (const auto &[name, kind] : row.placed)
            place(name, kind);
        setPath(row.path);
        {
            const WorkingFolder there(folder() / "here");
            const auto outcome = run("tool x");
            EXPECT_EQ(outcome.error.value(), row.error) << row.what;
            EXPECT_EQ(outcome.result, row.status) << row.what;
        }
        for (const auto &[name, kind] : row.placed)
            fs::remove_all(folder() / name);
        fs::create_directories(folder() / "here");
    }
}

TEST_F(ProgramLookup, TakesTheSystemsFoldersWherePathIsNotSet)
{
    place("here", "99");
    ::unsetenv("PATH");
    EXPECT_EQ(named("true"), "/bin/true");
    const WorkingFolder there(folder() / "here");
    EXPECT_EQ(resultOf("true"), 0);
    EXPECT_EQ(run("tool").error.value(), ENOENT);
}

TEST_F(ProgramLookup, FindsNoNameThatIsTooLongOrEmpty)
{
    setPath("@/a:@/b");
    EXPECT_EQ(errorOf(std::string(256, 'x')), ENAMETOOLONG);
    EXPECT_EQ(errorOf("\"\" x"), ENOENT);
}

TEST_F(ProgramLookup, EndsAtAFolderThatCannotBeLookedInto)
{
    place("b", "99");
    fs::create_directory_symlink("loop", folder() / "loop");
    setPath("@/a:@/loop:@/b");
    EXPECT_EQ(errorOf("tool"), ELOOP);
}

TEST_F(ProgramLookup, ChangesNothingWhereBoostProcessTakesTheSameAndNoNameWithASlash)
{
    place("b", "1");
    place("here", "file");
    setPath("@/a:@/b");
    for (const char *command : {"tool", " tool  x ", "\"tool\" \"a b\"", "tool \\\"x\\\"", "./tool",
                                "/nowhere/tool x", "\"a b/tool\" x", "here/", "/"})
        EXPECT_EQ(named(command), command);
}

TEST_F(ProgramLookup, PutsThePathInTheNamesPlace)
{
    place("a b", "1");
    setPath("@/a b:@/b");
    const std::string path = folder().path().string() + "/a b/tool";
    EXPECT_EQ(named("tool"), '"' + path + '"');
    EXPECT_EQ(named("  \"tool\" \"x y\" z "), "  \"" + path + "\" \"x y\" z ");
    place("c", "1");
    setPath("@/c:@/b");
    EXPECT_EQ(named(" \"tool\"  x"), ' ' + folder().path().string() + "/c/tool  x");
}

TEST_F(ProgramLookup, HandsTheOtherWordsOverAsTheyAre)
{
    const fs::path program = scripts_.shell("for word; do printf '%s|' \"$word\"; done >" +
                                            std::string(scripts_.folder() / "words"));
    fs::create_directories(folder() / "a b");
    fs::copy(program, folder() / "a b" / "tool");
    setPath("@/a b:/usr/bin:/bin");
    EXPECT_EQ(resultOf("tool \"x y\" z\"\" \"\" 'a"), 0);
    EXPECT_EQ(vclink::test::readFile(scripts_.folder() / "words"), "x y|z\"\"||'a|");
}

TEST_F(ProgramLookup, LeavesTheRecordOfTheCommandAsItIs)
{
    place("a", "1");
    setPath("@/a:@/b");
    EXPECT_THAT(recordsOf("tool x"), ElementsAre("Command: tool x", "Output:\n"));
    EXPECT_THAT(recordsOf("no-such-tool"), ElementsAre("Command: no-such-tool"));
}

} // namespace
