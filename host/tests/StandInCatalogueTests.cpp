// SPDX-License-Identifier: MIT
#include <atomic>
#include <cstdlib>
#include <filesystem>
#include <thread>

#include <gtest/gtest.h>

#include "fl/i18n/MessageCatalog.hpp"
#include "fl/i18n/convert.hpp"
#include "support/Files.hpp"
#include "support/Keys.hpp"
#include "support/LocaleOfTheProcess.hpp"
#include "vclink_host/locale.hpp"

using fl::i18n::to_string;
using fl::i18n::VkLocale;
using resource_core::BaseMsgID;
using vclink_host_tests::catalogue;
using vclink_host_tests::Folder;
using vclink_host_tests::makeAllMessages;
using vclink_host_tests::ScopedVariable;

namespace
{

const char *const installedCatalogues = VCLINK_STAGE_DIR "/share/locale";

std::string getText(const BaseMsgID &message, const std::string &locale)
{
    return to_string(fl::i18n::MessageCatalog::get_message(message, VkLocale(locale)));
}

std::string getText(const char *key, const std::string &locale)
{
    return getText(BaseMsgID({}, catalogue, key), locale);
}

/// Gives the global locale and the catalogues back as they were.
class StandInCatalogue : public testing::Test
{
  public:
    ~StandInCatalogue() override
    {
        vclink_host::setCatalogueFolder(installedCatalogues);
    }

  private:
    const vclink::test::LocaleOfTheProcess locale_{VkLocale::global().name()};
};

void appendNumber(std::string &bytes, std::size_t number)
{
    for (int shift = 0; shift < 32; shift += 8)
        bytes += static_cast<char>((number >> shift) & 0xFFU);
}

/// A compiled catalogue, as gettext's manual lays it out, that translates one message.
std::string makeCompiledCatalogue(const std::string &original, const std::string &translation)
{
    // The empty message comes first: it holds the header.
    const std::string header = "Content-Type: text/plain; charset=UTF-8\n";
    const std::size_t tables = 28;
    const std::size_t entry = 8;
    const std::size_t strings = tables + 4 * entry;
    std::string bytes;
    for (const std::size_t number : {std::size_t(0x950412DE), std::size_t(0), std::size_t(2),
                                     tables, tables + 2 * entry, std::size_t(0), strings})
        appendNumber(bytes, number);
    std::string texts;
    for (const std::string &text : {std::string(), original, header, translation})
    {
        appendNumber(bytes, text.size());
        appendNumber(bytes, strings + texts.size());
        texts += text + '\0';
    }
    return bytes + texts;
}

/// Puts a catalogue for the language "xx" into the folder, and makes the folder the one in use.
void useCatalogue(const Folder &folder, const std::string &content)
{
    std::filesystem::create_directories(folder / "xx/LC_MESSAGES");
    folder.write("xx/LC_MESSAGES/vclink_git.mo", content);
    vclink_host::setCatalogueFolder(folder.path());
}

const std::string checkoutKey =
    std::string("ProgressCallbackCheckoutMessage") + '\4' + "Checking out %1%";

BaseMsgID makeCheckoutMessage(const std::string &path)
{
    return BaseMsgID({fl::i18n::utf8_to_ustring(path)}, catalogue,
                     "ProgressCallbackCheckoutMessage");
}

TEST_F(StandInCatalogue, SpeaksPlainEnglishByDefault)
{
    const char *const texts[] = {
        "Git could not complete the operation: no such thing (code -17, category 42)",
        "\"topic\" could not be merged into the current branch.",
        "The merge left conflicts. Resolve them in the files concerned, mark these files as "
        "resolved, and then commit to complete the merge.",
        "A merge cannot begin while another operation, such as a merge, a rebase or a "
        "cherry-pick, is unfinished in this working copy. Complete or abort that operation first.",
        "The two branches have diverged, and the Git configuration allows only fast-forward "
        "merges (merge.ff is set to \"only\"). Nothing was changed.",
        "Nothing was added, because these files are not new to Git:\n/one\n/two",
        "There are no files to remove. Nothing was changed.",
        "Nothing was reverted, because these files have unresolved conflicts:\n/one\n/two",
        "Git does not know who makes this commit. Set user.name and user.email in the Git "
        "configuration, and try again.",
        "\"odd value\" cannot be understood as the value of a Git attribute.",
        "Checking out dir/file",
    };
    const auto messages = makeAllMessages();
    ASSERT_EQ(messages.size(), std::size(texts));
    for (std::size_t index = 0; index < messages.size(); ++index)
    {
        for (const char *locale : {"", "C", "C.UTF-8", "POSIX", "en_GB.UTF-8", "xx_YY", "../de"})
            EXPECT_EQ(getText(messages[index], locale), texts[index]) << locale;
    }
}

TEST_F(StandInCatalogue, HasEachTextInGermanAndJapanese)
{
    for (const BaseMsgID &message : makeAllMessages())
    {
        const std::string english = getText(message, "C");
        const std::string german = getText(message, "de_DE.UTF-8");
        const std::string japanese = getText(message, "ja_JP.UTF-8");
        EXPECT_NE(german, english) << message.getKey();
        EXPECT_NE(japanese, english) << message.getKey();
        EXPECT_NE(german, japanese) << message.getKey();
        for (const std::string &text : {german, japanese})
        {
            EXPECT_EQ(text.find("%1%"), std::string::npos) << text;
            EXPECT_EQ(text.find("/one\n/two") != std::string::npos,
                      english.find("/one\n/two") != std::string::npos);
        }
    }
}

TEST_F(StandInCatalogue, PutsTheArgumentsWhereTheLanguageWantsThem)
{
    EXPECT_EQ(getText(makeCheckoutMessage("a/b"), "de"), "a/b wird ausgecheckt");
    EXPECT_EQ(getText(makeCheckoutMessage("a/b"), "ja"), "a/b をチェックアウトしています");
    EXPECT_EQ(getText("NoFilesToRemove", "ja"),
              "削除するファイルがありません。何も変更されていません。");
}

TEST_F(StandInCatalogue, LooksOnlyAtLanguageAndCountry)
{
    const std::string german = getText("NoFilesToRemove", "de");
    EXPECT_EQ(german, "Es gibt keine Dateien zu entfernen. Es wurde nichts geändert.");
    for (const char *locale : {"de_AT", "de_DE.ISO-8859-1", "de_DE@euro", "de.UTF-8"})
        EXPECT_EQ(getText("NoFilesToRemove", locale), german) << locale;
}

TEST_F(StandInCatalogue, KeepsBytesOfFileNamesThatAreNotUtf8)
{
    const std::string path = "caf\xE9/\xC3/\xED\xA0\x80";
    EXPECT_EQ(getText(makeCheckoutMessage(path), "C"), "Checking out " + path);
    EXPECT_EQ(getText(makeCheckoutMessage(path), "de"), path + " wird ausgecheckt");
    const ustring units = fl::i18n::utf8_to_ustring(path);
    EXPECT_EQ(fl::i18n::MessageCatalog::get_message(makeCheckoutMessage(path), VkLocale("C")),
              u"Checking out " + units);
}

TEST_F(StandInCatalogue, GivesTheWordsOfAMessageThatItDoesNotKnowAndLeavesOutMissingArguments)
{
    EXPECT_EQ(getText("NoSuchKey", "de"), "shared_vclink:git:NoSuchKey");
    const BaseMsgID other({7L, std::string("two"), ustring(u"three")}, "other", "NoFilesToRemove");
    EXPECT_EQ(getText(other, "de"), "other:NoFilesToRemove (7, two, three)");
    EXPECT_EQ(getText(BaseMsgID({1L}, catalogue, "LibGit2Error"), "C"),
              "Git could not complete the operation:  (code 1, category )");
}

TEST_F(StandInCatalogue, TakesTheFolderThatTheHostSets)
{
    const Folder folder;
    useCatalogue(folder, makeCompiledCatalogue(checkoutKey, "%1%, of all things"));
    EXPECT_EQ(getText(makeCheckoutMessage("file"), "xx"), "file, of all things");
    EXPECT_EQ(getText(makeCheckoutMessage("file"), "de"), "Checking out file");
    // What the catalogue lacks is in English.
    EXPECT_EQ(getText("NoFilesToRemove", "xx"), getText("NoFilesToRemove", "C"));
    vclink_host::setCatalogueFolder(installedCatalogues);
    EXPECT_EQ(getText(makeCheckoutMessage("file"), "de"), "file wird ausgecheckt");
}

TEST_F(StandInCatalogue, TakesNoPathForALanguage)
{
    const Folder folder;
    useCatalogue(folder, makeCompiledCatalogue(checkoutKey, "translated"));
    std::filesystem::create_directory(folder / "sub");
    std::filesystem::rename(folder / "xx", folder / "sub/yy");
    EXPECT_EQ(getText(makeCheckoutMessage("file"), "sub/yy"), "Checking out file");
    vclink_host::setCatalogueFolder(folder.file("sub"));
    EXPECT_EQ(getText(makeCheckoutMessage("file"), "yy"), "translated");
}

TEST_F(StandInCatalogue, NeverRaisesForABrokenPlaceholder)
{
    const struct
    {
        const char *translation;
        const char *text;
    } rows[] = {
        {"without", "without"},
        {"%1% and %2%", "file and "},
        {"%9%", ""},
        {"%1", "%1"},
        {"100%", "100%"},
        {"%%1%%", "%1%"},
    };
    for (const auto &row : rows)
    {
        const Folder folder;
        useCatalogue(folder, makeCompiledCatalogue(checkoutKey, row.translation));
        EXPECT_EQ(getText(makeCheckoutMessage("file"), "xx"), row.text) << row.translation;
    }
    for (const char *translation :
         {"%", "%%%", "%|", "%|1$", "%1$", "%-", "%1%%", "%s %d %n", "%0%"})
    {
        const Folder folder;
        useCatalogue(folder, makeCompiledCatalogue(checkoutKey, translation));
        EXPECT_NO_THROW(getText(makeCheckoutMessage("file"), "xx")) << translation;
    }
}

TEST_F(StandInCatalogue, SpeaksEnglishWhenItsFileIsBroken)
{
    const std::string whole = makeCompiledCatalogue(checkoutKey, "translated");
    for (const std::string &content : {std::string(), std::string("no catalogue"),
                                       whole.substr(0, 20), std::string(4096, '\xFF')})
    {
        const Folder folder;
        useCatalogue(folder, content);
        EXPECT_EQ(getText(makeCheckoutMessage("file"), "xx"), "Checking out file");
    }
}

TEST_F(StandInCatalogue, IsAskedByManyThreadsAtOnce)
{
    std::atomic<int> wrong(0);
    const auto ask = [&wrong](const char *locale, const std::string &expected)
    {
        for (int round = 0; round < 200; ++round)
        {
            vclink_host::setGlobalLocale(VkLocale(locale));
            const bool isKnown = !VkLocale::global().name().empty();
            wrong += getText("NoFilesToRemove", locale) == expected && isKnown ? 0 : 1;
        }
    };
    std::thread german(ask, "de", getText("NoFilesToRemove", "de"));
    std::thread japanese(ask, "ja", getText("NoFilesToRemove", "ja"));
    german.join();
    japanese.join();
    EXPECT_EQ(wrong, 0);
}

TEST_F(StandInCatalogue, IsGlobalInTheLocaleThatTheHostSets)
{
    vclink_host::setGlobalLocale(VkLocale("ja_JP.UTF-8"));
    EXPECT_EQ(VkLocale::global().name(), "ja_JP.UTF-8");
    vclink_host::setGlobalLocale(VkLocale());
    EXPECT_EQ(VkLocale::global().name(), "");
}

/// In a process of its own, which has not asked for the locale yet.
class StandInLocaleDeathTest : public testing::Test
{
  public:
    StandInLocaleDeathTest()
    {
        testing::FLAGS_gtest_death_test_style = "threadsafe";
    }
};

TEST_F(StandInLocaleDeathTest, BeginsWithTheFirstVariableThatIsNotEmpty)
{
    const struct
    {
        const char *all;
        const char *messages;
        const char *lang;
        const char *name;
    } rows[] = {
        {"de_DE.UTF-8", "ja", "fr", "de_DE.UTF-8"},
        {"", "ja", "fr", "ja"},
        {"", "", "fr", "fr"},
        {"", "", "", ""},
    };
    for (const auto &row : rows)
    {
        const ScopedVariable all("LC_ALL", row.all);
        const ScopedVariable messages("LC_MESSAGES", row.messages);
        const ScopedVariable lang("LANG", row.lang);
        EXPECT_EXIT(std::exit(VkLocale::global().name() == row.name ? 0 : 1),
                    testing::ExitedWithCode(0), "");
    }
}

} // namespace
