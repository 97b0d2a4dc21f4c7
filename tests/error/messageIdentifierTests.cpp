// SPDX-License-Identifier: MIT
#include "vclink/git/messageIdentifiers.hpp"

#include <set>
#include <string>
#include <type_traits>
#include <vector>

#include <boost/variant/get.hpp>
#include <gtest/gtest.h>

#include "error/raise.hpp"
#include "fl/i18n/MessageCatalog.hpp"
#include "fl/i18n/VkLocale.hpp"
#include "support/LocaleOfTheProcess.hpp"
#include "vclink/git/GitException.hpp"

namespace vclink::git
{
namespace
{

using namespace shared_vclink::git;
using fl::i18n::VkLocale;
using resource_core::BaseMsgID;
using resource_core::MsgArgument;
using test::LocaleOfTheProcess;

static_assert(std::is_same_v<MsgArgument, boost::variant<long, std::string, ustring>>);

const ustring report = u"a/Z\u00FCrich\nb/\u6771\u4EAC";

/// A message, its key and its arguments.
struct Row
{
    BaseMsgID message;
    std::string key;
    std::vector<MsgArgument> arguments;
};
const Row rows[] = {
    {LibGit2Error(-3, 7, report), "LibGit2Error", {-3L, 7L, report}},
    {MergeFailed(std::string("topic")), "MergeFailed", {std::string("topic")}},
    {HasConflicts(), "HasConflicts", {}},
    {UnableToMergeBadRepositoryState(), "UnableToMergeBadRepositoryState", {}},
    {MergePreferenceFastForward(), "MergePreferenceFastForward", {}},
    {AlreadyAdded(report), "AlreadyAdded", {report}},
    {NoFilesToRemove(), "NoFilesToRemove", {}},
    {Conflicted(report), "Conflicted", {report}},
    {NoUserName(), "NoUserName", {}},
    {InvalidGitAttributeValue("value"), "InvalidGitAttributeValue", {std::string("value")}},
    {ProgressCallbackCheckoutMessage(report), "ProgressCallbackCheckoutMessage", {report}},
};

TEST(MessageIdentifiers, AreNamedLikeTheirClassesAndKeepTheirArguments)
{
    for (const auto &[message, key, arguments] : rows)
    {
        EXPECT_EQ(message.getCatalogue(), "shared_vclink:git");
        EXPECT_EQ(message.getKey(), key);
        EXPECT_TRUE(message.getArguments() == arguments) << key;
    }
}

TEST(MessageIdentifiers, KeepATextOfEachTypeInItsOwnType)
{
    EXPECT_NE(boost::get<ustring>(&AlreadyAdded(report).getArguments()[0]), nullptr);
    EXPECT_NE(boost::get<std::string>(&MergeFailed(std::string("b")).getArguments()[0]), nullptr);
    const char *const raw = "raw";
    const InvalidGitAttributeValue fromRaw(raw);
    ASSERT_NE(boost::get<std::string>(&fromRaw.getArguments()[0]), nullptr);
    EXPECT_EQ(boost::get<std::string>(fromRaw.getArguments()[0]), "raw");
    EXPECT_NE(boost::get<std::string>(&LibGit2Error(1, 2, "text").getArguments()[2]), nullptr);
}

TEST(MessageIdentifiers, KeepCopiesOfTheirTexts)
{
    std::string text = "before";
    const InvalidGitAttributeValue message(text.c_str());
    text[0] = 'X';
    EXPECT_EQ(boost::get<std::string>(message.getArguments()[0]), "before");
}

TEST(MessageIdentifiers, HaveATextOfTheirOwnWithTheirArgumentsInEveryLanguage)
{
    std::set<ustring> texts;
    for (const std::string language : {"en", "de", "ja"})
    {
        for (const Row &row : rows)
        {
            SCOPED_TRACE(language + ' ' + row.key);
            const ustring text =
                fl::i18n::MessageCatalog::get_message(row.message, VkLocale(language));
            EXPECT_TRUE(texts.insert(text).second);
            EXPECT_EQ(text.find(u"shared_vclink"), ustring::npos);
            EXPECT_EQ(text.find(u'%'), ustring::npos);
        }
        const LocaleOfTheProcess locale(language);
        const auto expectShown = [](const GitException &exception, const ustring &argument)
        { EXPECT_NE(exception.GetUnicodeMessageTxt().find(argument), ustring::npos); };
        const GitException failure(LibGit2Error(-1234, 5678, report));
        expectShown(failure, u"-1234");
        expectShown(failure, u"5678");
        expectShown(failure, report);
        expectShown(GitException(MergeFailed("topic")), u"topic");
        expectShown(GitException(Conflicted(report)), report);
    }
    EXPECT_EQ(texts.size(), 33u);
}

/// Expects that the exception's text is that of the locale in which it is asked for.
template <class Exception> void expectTextOfTheMoment(const Exception &exception)
{
    const BaseMsgID &message = exception.GetBaseMsgIDObj();
    for (const char *const language : {"de", "ja", "en", "de"})
    {
        const LocaleOfTheProcess locale(language);
        EXPECT_EQ(exception.GetUnicodeMessageTxt(),
                  fl::i18n::MessageCatalog::get_message(message, VkLocale(language)))
            << language;
    }
}

TEST(MessageIdentifiers, GetTheirTextInTheLocaleOfTheMomentOfAsking)
{
    const LocaleOfTheProcess locale("en");
    expectTextOfTheMoment(GitException(MergeFailed("topic")));
    expectTextOfTheMoment(
        TagException<NoUserName>(NoUserName(), vclink::exception::SourceControlException{}));
}

} // namespace
} // namespace vclink::git
