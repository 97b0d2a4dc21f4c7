// SPDX-License-Identifier: MIT
// Where a command without a slash is looked for: as execvpe(3) does.
#include <cerrno>
#include <cstdlib>
#include <filesystem>
#include <string>
#include <system_error>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "RunCommandTest.hpp"
#include "support/WorkingFolder.hpp"
#include "util/command/programLookup.hpp"

namespace
{

namespace fs = std::filesystem;
using testing::ElementsAre;
using vclink::test::WorkingFolder;

/// What stands under the name "tool" in a folder of the lookup's.
enum class LookupKind
{
    Program,
    PlainFile,
    Folder
};

struct LookupEntry
{
    const char *folder; ///< below the fixture's; "here" is the working folder
    LookupKind kind;
    int status; ///< with which the program ends
};

class ProgramLookup : public vclink::test::RunCommandTest
{
  protected:
    ProgramLookup()
    {
        fs::create_directories(folder() / "here");
    }

    void place(const LookupEntry &entry)
    {
        const fs::path path = folder() / entry.folder / "tool";
        fs::create_directories(path.parent_path());
        if (entry.kind == LookupKind::Folder)
        {
            fs::create_directory(path);
            return;
        }
        fs::copy(scripts_.shell("exit " + std::to_string(entry.status)), path);
        if (entry.kind == LookupKind::PlainFile)
            fs::permissions(path, fs::perms::owner_read | fs::perms::owner_write);
    }

    /// Sets PATH, every '@' standing for the fixture's folder.
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
    std::vector<LookupEntry> entries;
    const char *path;
    int status; ///< of the program that runs, or 0
    int error;  ///< or this one
};

/// The status of a program that the lookup must not choose.
constexpr int wrongStatus = 99;

const std::vector<LookupRow> &lookupRows()
{
    static const std::vector<LookupRow> table{
        {"the first folder of PATH", {{"a", LookupKind::Program, 1}}, "@/a:@/b", 1, 0},
        {"the only folder of PATH", {{"a", LookupKind::Program, 1}}, "@/a", 1, 0},
        {"a later folder of PATH", {{"b", LookupKind::Program, 2}}, "@/a:@/b", 2, 0},
        {"the first of two",
         {{"a", LookupKind::Program, 1}, {"b", LookupKind::Program, wrongStatus}},
         "@/a:@/b",
         1,
         0},
        {"the second of three",
         {{"b", LookupKind::Program, 2}, {"c", LookupKind::Program, wrongStatus}},
         "@/a:@/b:@/c",
         2,
         0},
        {"not the working folder",
         {{"here", LookupKind::Program, wrongStatus}, {"b", LookupKind::Program, 2}},
         "@/a:@/b",
         2,
         0},
        {"not the working folder, with nothing in PATH",
         {{"here", LookupKind::Program, wrongStatus}},
         "@/a:@/b",
         0,
         ENOENT},
        {"not a folder of the working folder",
         {{"here", LookupKind::Folder, wrongStatus}, {"b", LookupKind::Program, 2}},
         "@/a:@/b",
         2,
         0},
        {"not what lies in a folder named like the variable",
         {{"here/PATH=a", LookupKind::Program, wrongStatus}, {"b", LookupKind::Program, 2}},
         "a:@/b",
         2,
         0},
        {"the working folder, by an empty first element",
         {{"here", LookupKind::Program, 3}, {"b", LookupKind::Program, wrongStatus}},
         ":@/b",
         3,
         0},
        {"the working folder, by an empty element in the middle",
         {{"here", LookupKind::Program, 3}, {"b", LookupKind::Program, wrongStatus}},
         "@/a::@/b",
         3,
         0},
        {"the working folder, by an empty last element",
         {{"here", LookupKind::Program, 3}},
         "@/a:",
         3,
         0},
        {"the working folder, by an empty PATH", {{"here", LookupKind::Program, 3}}, "", 3, 0},
        {"the working folder, by a dot", {{"here", LookupKind::Program, 3}}, "@/a:.", 3, 0},
        {"a folder before an empty element",
         {{"here", LookupKind::Program, wrongStatus}, {"a", LookupKind::Program, 1}},
         "@/a:",
         1,
         0},
        {"a relative folder", {{"here/bin", LookupKind::Program, 4}}, "@/a:bin", 4, 0},
        {"a relative first folder", {{"here/bin", LookupKind::Program, 4}}, "bin:@/a", 4, 0},
        {"a folder with blanks", {{"a b  c", LookupKind::Program, 5}}, "@/a b  c:@/b", 5, 0},
        {"a later folder with blanks", {{"a b", LookupKind::Program, 5}}, "@/a:@/a b", 5, 0},
        {"a folder with a double quote",
         {{"a\"b", LookupKind::Program, wrongStatus}},
         "@/a\"b",
         0,
         EINVAL},
        {"a later folder with a double quote",
         {{"a\"b", LookupKind::Program, 5}},
         "@/b:@/a\"b",
         5,
         0},
        {"not a folder of that name",
         {{"a", LookupKind::Folder, wrongStatus}, {"b", LookupKind::Program, 2}},
         "@/a:@/b",
         2,
         0},
        {"not a later folder of that name",
         {{"b", LookupKind::Folder, wrongStatus}, {"c", LookupKind::Program, 2}},
         "@/a:@/b:@/c",
         2,
         0},
        {"nothing but a folder of that name",
         {{"b", LookupKind::Folder, wrongStatus}},
         "@/a:@/b",
         0,
         EACCES},
        {"not a file that may not be executed",
         {{"a", LookupKind::PlainFile, wrongStatus}, {"b", LookupKind::Program, 2}},
         "@/a:@/b",
         2,
         0},
        {"nothing but a file that may not be executed",
         {{"a", LookupKind::PlainFile, wrongStatus}},
         "@/a:@/b",
         0,
         EACCES},
        {"not a file of the working folder that may not be executed",
         {{"here", LookupKind::PlainFile, wrongStatus}, {"b", LookupKind::Program, 2}},
         "@/a:@/b",
         2,
         0},
        {"not an element that is a file",
         {{"a", LookupKind::PlainFile, wrongStatus}, {"b", LookupKind::Program, 2}},
         "@/a/tool:@/b",
         2,
         0},
        {"nothing", {}, "@/a:@/b", 0, ENOENT}};
    return table;
}

TEST_F(ProgramLookup, IsThatOfExecvpe)
{
    for (const LookupRow &row : lookupRows())
    {
        for (const LookupEntry &entry : row.entries)
            place(entry);
        setPath(row.path);
        {
            const WorkingFolder there(folder() / "here");
            const auto outcome = run("tool x");
            EXPECT_EQ(outcome.error.value(), row.error) << row.what;
            EXPECT_EQ(outcome.result, row.error == 0 ? row.status : -1) << row.what;
        }
        for (const LookupEntry &entry : row.entries)
            fs::remove_all(folder() / entry.folder);
        fs::create_directories(folder() / "here");
    }
}

TEST_F(ProgramLookup, TakesTheSystemsFoldersWherePathIsNotSet)
{
    place({"here", LookupKind::Program, wrongStatus});
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
    place({"b", LookupKind::Program, wrongStatus});
    fs::create_directory_symlink("loop", folder() / "loop");
    setPath("@/a:@/loop:@/b");
    EXPECT_EQ(errorOf("tool"), ELOOP);
}

TEST_F(ProgramLookup, ChangesNothingWhereBoostProcessTakesTheSame)
{
    place({"b", LookupKind::Program, 1});
    place({"here", LookupKind::PlainFile, wrongStatus});
    setPath("@/a:@/b");
    for (const char *command : {"tool", " tool  x ", "\"tool\" \"a b\"", "tool \\\"x\\\""})
        EXPECT_EQ(named(command), command);
}

TEST_F(ProgramLookup, ChangesNoNameWithASlash)
{
    place({"here", LookupKind::Program, 1});
    setPath("@/a:@/b");
    for (const char *command : {"./tool", "/nowhere/tool x", "\"a b/tool\" x", "here/", "/"})
        EXPECT_EQ(named(command), command);
}

TEST_F(ProgramLookup, PutsThePathInTheNamesPlace)
{
    place({"a b", LookupKind::Program, 1});
    setPath("@/a b:@/b");
    const std::string path = folder().path().string() + "/a b/tool";
    EXPECT_EQ(named("tool"), '"' + path + '"');
    EXPECT_EQ(named("  \"tool\" \"x y\" z "), "  \"" + path + "\" \"x y\" z ");
    place({"c", LookupKind::Program, 1});
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
    EXPECT_EQ(vclink::test::Scripts::read(scripts_.folder() / "words"), "x y|z\"\"||'a|");
}

TEST_F(ProgramLookup, LeavesTheRecordOfTheCommandAsItIs)
{
    place({"a", LookupKind::Program, 1});
    setPath("@/a:@/b");
    EXPECT_THAT(recordsOf("tool x"), ElementsAre("Command: tool x", "Output:\n"));
    EXPECT_THAT(recordsOf("no-such-tool"), ElementsAre("Command: no-such-tool"));
}

} // namespace
