// SPDX-License-Identifier: MIT
#include <map>
#include <string>

#include <gtest/gtest.h>
#include <unistd.h>

#include "util/command/commandLine.hpp"

namespace
{

using vclink::git::expandPlaceholders;
using vclink::git::findCommandFault;
using vclink::git::findFirstWord;

const std::map<std::string, std::string> &driverValues()
{
    static const std::map<std::string, std::string> values{
        {"%O", "/o"}, {"%A", "/a"}, {"%B", "/b"}, {"%L", "7"}, {"%P", "sub/file"}};
    return values;
}

/// The fault of a command, or an empty text.
std::string fault(const std::string &command)
{
    const char *const text = findCommandFault(command);
    return text == nullptr ? std::string() : std::string(text);
}

TEST(ExpandPlaceholders, ReplacesEveryOccurrenceOfEveryKey)
{
    EXPECT_EQ(expandPlaceholders("tool %O %A %B %L %P", driverValues()),
              "tool /o /a /b 7 sub/file");
    EXPECT_EQ(expandPlaceholders("tool %O %A %B %A", driverValues()), "tool /o /a /b /a");
    EXPECT_EQ(expandPlaceholders("%A%A%A", driverValues()), "/a/a/a");
}

TEST(ExpandPlaceholders, LeavesATemplateWithoutPlaceholdersAsItIs)
{
    EXPECT_EQ(expandPlaceholders("", driverValues()), "");
    EXPECT_EQ(expandPlaceholders("tool", driverValues()), "tool");
    EXPECT_EQ(expandPlaceholders("tool %A", {}), "tool %A");
}

TEST(ExpandPlaceholders, ReplacesPlainTextInsideWordsAndQuotes)
{
    EXPECT_EQ(expandPlaceholders("--out=%A,x \"%P\"", driverValues()), "--out=/a,x \"sub/file\"");
}

TEST(ExpandPlaceholders, LeavesWhatIsNoPlaceholder)
{
    EXPECT_EQ(expandPlaceholders("%a %X %S %Y %% % 100%", driverValues()), "%a %X %S %Y %% % 100%");
    EXPECT_EQ(expandPlaceholders("%%A", driverValues()), "%/a");
}

TEST(ExpandPlaceholders, QuotesNothing)
{
    EXPECT_EQ(expandPlaceholders("tool %P", {{"%P", "a b\"c"}}), "tool a b\"c");
}

TEST(ExpandPlaceholders, ScansAValueForTheKeysThatFollow)
{
    EXPECT_EQ(expandPlaceholders(
                  "%A", {{"%A", "%B%L%O%P"}, {"%B", "b"}, {"%L", "l"}, {"%O", "o"}, {"%P", "p"}}),
              "blop");
}

TEST(ExpandPlaceholders, DoesNotScanAValueForItsOwnKeyOrThoseBefore)
{
    EXPECT_EQ(expandPlaceholders("%P", {{"%P", "%P%A"}, {"%A", "a"}}), "%P%A");
}

TEST(ExpandPlaceholders, FindsAKeyThatAValueCompletes)
{
    EXPECT_EQ(expandPlaceholders("%%AP", {{"%A", ""}, {"%P", "p"}}), "p");
}

TEST(CommandFault, IsNoneInACommandWithAWord)
{
    for (const char *command :
         {"tool", " tool", "tool ", "tool a b", "\"a b/tool\" x", "a\"b", "\"\"", "\"a", "a\"",
          "tool \"a", "tool a\"", "tool \" x", "\" x", "tool \"\"", "\t", "\n", "tool\n"})
        EXPECT_EQ(fault(command), "") << command;
}

TEST(CommandFault, IsACommandWithoutAWord)
{
    for (const char *command : {"", " ", "      "})
        EXPECT_EQ(fault(command), "the command is empty") << '\'' << command << '\'';
}

TEST(CommandFault, IsALoneQuoteAsAWord)
{
    for (const char *command : {"\"", " \"", "tool \"", "tool x  \"", "\"a b\" \"", "\"\" \""})
        EXPECT_EQ(fault(command), "a double quote of the command is not closed") << command;
}

TEST(CommandFault, IsAnEmptyEnvironment)
{
    char *none[] = {nullptr};
    char **const before = environ;
    environ = none;
    const std::string emptied = fault("tool");
    environ = nullptr;
    const std::string absent = fault("tool");
    environ = before;
    EXPECT_EQ(emptied, "the environment is empty");
    EXPECT_EQ(absent, "the environment is empty");
    EXPECT_EQ(fault("tool"), "");
}

TEST(FirstWord, IsWhatBoostProcessTakesForTheProgram)
{
    struct Row
    {
        const char *command;
        const char *written; ///< in the command
        const char *text;
    };
    for (const Row &row :
         {Row{"tool", "tool", "tool"}, Row{"  tool x", "tool", "tool"},
          Row{"tool  \"a b\"", "tool", "tool"}, Row{"\"tool\" x", "\"tool\"", "tool"},
          Row{"\"a b/tool\" x", "\"a b/tool\"", "a b/tool"},
          Row{"\"a b\"c x", "\"a b\"c", "\"a b\"c"}, Row{"a\"b c\"d x", "a\"b c\"d", "a\"b c\"d"},
          Row{"\"\" x", "\"\"", ""}, Row{"\\\"a\\\" x", "\\\"a\\\"", "\"a\""},
          Row{"\"a b", "\"a b", "\"a b"}, Row{"\ttool\n x", "\ttool\n", "\ttool\n"}})
    {
        const std::string command = row.command;
        const auto word = findFirstWord(command);
        EXPECT_EQ(command.substr(word.begin, word.size), row.written) << command;
        EXPECT_EQ(word.text, row.text) << command;
    }
}

} // namespace
