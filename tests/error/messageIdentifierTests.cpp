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

void expectMessage(const BaseMsgID &message, const std::string &key,
                   const std::vector<MsgArgument> &arguments)
{
    EXPECT_EQ(message.getCatalogue(), "shared_vclink:git");
    EXPECT_EQ(message.getKey(), key);
    EXPECT_TRUE(message.getArguments() == arguments) << key;
}

const ustring report = u"a/Z\u00FCrich\nb/\u6771\u4EAC";

/// All messages, with arguments of the types that they are raised with.
std::vector<BaseMsgID> allMessages()
{
    return {LibGit2Error(-3, 7, report),
            MergeFailed(std::string("topic")),
            HasConflicts(),
            UnableToMergeBadRepositoryState(),
            MergePreferenceFastForward(),
            AlreadyAdded(report),
            NoFilesToRemove(),
            Conflicted(report),
            NoUserName(),
            InvalidGitAttributeValue("value"),
            ProgressCallbackCheckoutMessage(report)};
}

TEST(MessageIdentifiers, AreNamedLikeTheirClassesAndKeepTheirArguments)
{
    expectMessage(LibGit2Error(-3, 7, report), "LibGit2Error", {-3L, 7L, report});
    expectMessage(MergeFailed(std::string("topic")), "MergeFailed", {std::string("topic")});
    expectMessage(HasConflicts(), "HasConflicts", {});
    expectMessage(UnableToMergeBadRepositoryState(), "UnableToMergeBadRepositoryState", {});
    expectMessage(MergePreferenceFastForward(), "MergePreferenceFastForward", {});
    expectMessage(AlreadyAdded(report), "AlreadyAdded", {report});
    expectMessage(NoFilesToRemove(), "NoFilesToRemove", {});
    expectMessage(Conflicted(report), "Conflicted", {report});
    expectMessage(NoUserName(), "NoUserName", {});
    expectMessage(InvalidGitAttributeValue("value"), "InvalidGitAttributeValue",
                  {std::string("value")});
    expectMessage(ProgressCallbackCheckoutMessage(report), "ProgressCallbackCheckoutMessage",
                  {report});
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

TEST(MessageIdentifiers, HaveATextOfTheirOwnInEveryLanguage)
{
    std::set<ustring> texts;
    for (const char *const language : {"en", "de", "ja"})
    {
        for (const BaseMsgID &message : allMessages())
        {
            const ustring text = fl::i18n::MessageCatalog::get_message(message, VkLocale(language));
            EXPECT_TRUE(texts.insert(text).second) << language << ' ' << message.getKey();
            EXPECT_EQ(text.find(u"shared_vclink"), ustring::npos)
                << language << ' ' << message.getKey();
            EXPECT_EQ(text.find(u'%'), ustring::npos) << language << ' ' << message.getKey();
        }
    }
    EXPECT_EQ(texts.size(), 33u);
}

TEST(MessageIdentifiers, HaveTheirArgumentsInTheirTexts)
{
    for (const char *const language : {"en", "de", "ja"})
    {
        const LocaleOfTheProcess locale(language);
        const ustring failure =
            GitException(LibGit2Error(-1234, 5678, report)).GetUnicodeMessageTxt();
        EXPECT_NE(failure.find(u"-1234"), ustring::npos) << language;
        EXPECT_NE(failure.find(u"5678"), ustring::npos) << language;
        EXPECT_NE(failure.find(report), ustring::npos) << language;
        EXPECT_NE(GitException(MergeFailed("topic")).GetUnicodeMessageTxt().find(u"topic"),
                  ustring::npos)
            << language;
        EXPECT_NE(GitException(Conflicted(report)).GetUnicodeMessageTxt().find(report),
                  ustring::npos)
            << language;
    }
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
