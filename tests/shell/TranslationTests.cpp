// SPDX-License-Identifier: MIT
#include <algorithm>
#include <cctype>
#include <map>
#include <regex>
#include <set>
#include <string>

#include <gmock/gmock.h>

#include "examples/shell/texts.hpp"
#include "examples/shell/translations.hpp"
#include "sourceTexts.hpp"

namespace vclink::test
{
namespace
{

using testing::IsEmpty;
using testing::Not;

using Rows = std::map<std::string, shell::Translation>;

Rows allRows()
{
    Rows rows;
    for (const shell::TranslationTable &table : shell::translationTables())
    {
        for (std::size_t index = 0; index < table.size; ++index)
        {
            const bool isNew = rows.emplace(table.rows[index].english, table.rows[index]).second;
            EXPECT_TRUE(isNew) << table.rows[index].english << " has two rows";
        }
    }
    return rows;
}

std::set<std::string> placeholders(const std::string &text)
{
    static const std::regex placeholder("%[1-9]%");
    return {std::sregex_token_iterator(text.begin(), text.end(), placeholder),
            std::sregex_token_iterator()};
}

/// Two words in a row, so that a person reads them.
bool isSentence(const std::string &text)
{
    static const std::regex words("[A-Za-z']{2,} [A-Za-z']{2,}");
    return std::regex_search(text, words);
}

/// What is meant for programs, or comes from them.
bool isForPrograms(const std::string &text)
{
    static const std::set<std::string> words{
        // of the library's log and states, of git's servers, and of the reader of the arguments
        "Auto-merge unsuccessful", "Throwing error ", "Rebase interactive", "Apply mailbox",
        "Rebase/Apply mailbox", "Enumerating objects:", "Counting objects:", "Compressing objects:",
        "Resolving deltas:", "Unpacking objects:", "Checking connectivity", " is required",
        "At Most",
        // of the library's refusals
        "is not in this partial clone",
        // of libgit2
        "unsupported repository ", "unsupported extension ", "unknown object format ",
        "collides with existing one", "there are refs beneath that folder",
        "parent is not directory",
        // a failure of the system
        "A pipe can't be made", "Standard output is closed."};
    const bool isCommand = text.rfind("git ", 0) == 0 || text.rfind("vclink-shell ", 0) == 0;
    return isCommand || words.count(text) != 0;
}

class ShellTranslations : public testing::Test
{
  protected:
    const Rows rows_ = allRows();
    const SourceTexts texts_ = readSourceTexts(VCLINK_SHELL_SOURCES);
};

TEST_F(ShellTranslations, HaveARowForAllThatIsSaid)
{
    ASSERT_GT(texts_.said.size(), 150U);
    for (const std::string &text : texts_.said)
        EXPECT_EQ(rows_.count(text), 1U) << text;
}

TEST_F(ShellTranslations, HaveARowForEachSentenceInTheSources)
{
    ASSERT_GT(texts_.others.size(), 100U);
    for (const std::string &text : texts_.others)
    {
        if (isSentence(text) && !isForPrograms(text))
        {
            EXPECT_EQ(rows_.count(text), 1U) << text;
        }
    }
}

TEST_F(ShellTranslations, HaveNoRowForWhatIsNotSaid)
{
    for (const auto &[english, row] : rows_)
        EXPECT_TRUE(texts_.said.count(english) + texts_.others.count(english) != 0) << english;
}

TEST_F(ShellTranslations, FillInTheSameValues)
{
    for (const auto &[english, row] : rows_)
    {
        for (const std::string &text : {std::string(row.german), std::string(row.japanese)})
        {
            EXPECT_THAT(text, Not(IsEmpty())) << english;
            EXPECT_EQ(placeholders(text), placeholders(english)) << text;
            EXPECT_EQ(text.find('\t'), std::string::npos) << text;
        }
    }
}

TEST_F(ShellTranslations, FitATerminalWhereTheyAreHelp)
{
    for (const auto &[english, row] : rows_)
    {
        if (english.find('\n') == std::string::npos)
            continue;
        for (const std::string &text : {english, std::string(row.german)})
        {
            for (std::size_t start = 0, end = 0; end != std::string::npos; start = end + 1)
            {
                end = text.find('\n', start);
                const std::string line = text.substr(start, end - start);
                const auto isFirstByte = [](char byte) { return (byte & 0xC0) != 0x80; };
                EXPECT_LE(std::count_if(line.begin(), line.end(), isFirstByte), 130) << line;
            }
        }
    }
}

TEST(ShellText, IsFilledInOnce)
{
    EXPECT_EQ(shell::fill("%1% and %2%, %1%", {"%2%", "b"}), "%2% and b, %2%");
    EXPECT_EQ(shell::fill("100% of %3%%", {"a"}), "100% of %");
}

TEST(ShellText, IsInTheLanguageThatWasSet)
{
    shell::setLanguage("de_AT.UTF-8");
    EXPECT_EQ(shell::sayCount(1, "%1% file", "%1% files"), "1 Datei");
    EXPECT_EQ(shell::sayCount(0, "%1% file", "%1% files"), "0 Dateien");
    shell::setLanguage("ja");
    EXPECT_EQ(shell::say("Done."), "完了しました。");
    shell::setLanguage("C");
    EXPECT_EQ(shell::say("Done."), "Done.");
}

} // namespace
} // namespace vclink::test
