// SPDX-License-Identifier: MIT
#include "vclink/git/GitException.hpp"

#include <algorithm>
#include <cstdint>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include <boost/variant/get.hpp>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "error/catalogueText.hpp"
#include "error/exceptions.hpp"
#include "error/logging/severity.hpp"
#include "fl/i18n/convert.hpp"
#include "support/LogCapture.hpp"
#include "support/isRecord.hpp"
#include "vclink/git/messageIdentifiers.hpp"

namespace vclink::git
{
namespace
{

using foundation::core::except::IException;
using foundation::core::except::IMsgIDException;
using foundation::core::except::IUserException;
using resource_core::GenericMsgIDHolder;
using shared_vclink::git::LibGit2Error;
using shared_vclink::git::MergeFailed;
using test::catalogueText;
using test::framesOf;
using test::LogCapture;
using testing::IsEmpty;

/// Makes an exception, and returns where the caller continues after the call.
[[gnu::noinline]] GitException makeException(const void *&returnsTo)
{
    returnsTo = __builtin_return_address(0);
    return GitException(MergeFailed("topic"), u"cause");
}

/// What two exceptions have in common when one is a copy of the other.
void expectSameContent(const GitException &copy, const GitException &original)
{
    EXPECT_TRUE(copy.GetBaseMsgIDObj().getArguments() == original.GetBaseMsgIDObj().getArguments());
    EXPECT_EQ(copy.GetBaseMsgIDObj().getCatalogue(), original.GetBaseMsgIDObj().getCatalogue());
    EXPECT_EQ(copy.GetBaseMsgIDObj().getKey(), original.GetBaseMsgIDObj().getKey());
    EXPECT_NE(&copy.GetBaseMsgIDObj(), &original.GetBaseMsgIDObj());
    EXPECT_EQ(copy.GetUnicodeMessageTxt(), original.GetUnicodeMessageTxt());
    EXPECT_EQ(copy.getText(), original.getText());
    EXPECT_EQ(framesOf(copy), framesOf(original));
}

TEST(GitException, HasTheCataloguesTextAndTheAddedOneAfterALineFeed)
{
    const MergeFailed message("topic");
    EXPECT_EQ(GitException(message).GetUnicodeMessageTxt(), catalogueText(message));
    EXPECT_EQ(GitException(message, u"").GetUnicodeMessageTxt(), catalogueText(message));
    EXPECT_NE(catalogueText(message).back(), u'\n');
    EXPECT_EQ(GitException(message, u"cause\n").GetUnicodeMessageTxt(),
              catalogueText(message) + u"\ncause\n");
}

TEST(GitException, GivesItsTextInEveryWayAndConvertsTextsAsEveryUsersException)
{
    const GitException exception(MergeFailed("Z\xC3\xBCrich"), u"\u6771\u4EAC");
    const ustring text = exception.GetUnicodeMessageTxt();
    EXPECT_EQ(exception.ToUstringImpl(), text);
    const std::string narrow = fl::i18n::to_string(text);
    EXPECT_EQ(exception.what(), narrow);
    EXPECT_EQ(static_cast<const IException &>(exception).what(), narrow);
    EXPECT_EQ(static_cast<const std::exception &>(exception).what(), narrow);
    EXPECT_EQ(exception.convert_str(ustring(u"Z\u00FCrich")), u"Z\u00FCrich");
    EXPECT_EQ(exception.convert_str(std::string("Z\xC3\xBCrich")), u"Z\u00FCrich");
}

TEST(GitException, IsNamedByItsMessage)
{
    const MergeFailed message("topic");
    EXPECT_EQ(GitException(message).GetID(), IMsgIDException::get_error_id(message));
    EXPECT_EQ(GitException(message, u"cause").GetID(), GitException(MergeFailed("other")).GetID());
    EXPECT_NE(GitException(message).GetID(), GitException(LibGit2Error(1, 2, "")).GetID());
}

TEST(GitException, KeepsACopyOfTheMessageOfItsOwn)
{
    std::optional<LibGit2Error> message(std::in_place, -3, 7, ustring(u"text"));
    const GitException exception(*message);
    EXPECT_NE(&exception.GetBaseMsgIDObj(), &*message);
    message.reset();
    const auto &kept = exception.GetBaseMsgIDObj();
    EXPECT_EQ(kept.getCatalogue(), "shared_vclink:git");
    EXPECT_EQ(kept.getKey(), "LibGit2Error");
    ASSERT_EQ(kept.getArguments().size(), 3u);
    EXPECT_EQ(boost::get<long>(kept.getArguments()[0]), -3);
    EXPECT_EQ(boost::get<long>(kept.getArguments()[1]), 7);
    EXPECT_EQ(boost::get<ustring>(kept.getArguments()[2]), u"text");
}

TEST(GitException, IsCopiedClonedAndRethrownWithAllItHolds)
{
    const void *returnsTo = nullptr;
    auto original = std::make_unique<GitException>(makeException(returnsTo));
    test::expectCopies(*original,
                       [&](const GitException &copy) { expectSameContent(copy, *original); });
    const GitException copy(*original);
    expectSameContent(copy, *original);
    original.reset();
    EXPECT_EQ(copy.GetUnicodeMessageTxt(), catalogueText(MergeFailed("topic")) + u"\ncause");
}

TEST(GitException, IsCaughtAsEachOfItsBases)
{
    test::expectCaughtAs<IMsgIDException, IUserException, IException, boost::exception,
                         vclink::exception::SourceControlException,
                         computils::exception::StackTraceRecordingException, std::exception>(
        [] { throw GitException(MergeFailed("topic")); });
}

TEST(GitException, RecordsTheStackOfTheCodeThatRaisesIt)
{
    const void *returnsTo = nullptr;
    const GitException exception = makeException(returnsTo);
    const std::vector<const void *> frames = framesOf(exception);
    const auto caller = std::find(frames.begin(), frames.end(), returnsTo);
    ASSERT_NE(caller, frames.end()) << "the caller of the raising function is not there";
    ASSERT_NE(caller, frames.begin());
    const auto inside = reinterpret_cast<std::uintptr_t>(*std::prev(caller));
    const auto function = reinterpret_cast<std::uintptr_t>(&makeException);
    EXPECT_GT(inside, function);
    EXPECT_LT(inside, function + 0x10000);
    EXPECT_EQ(exception.getText(), ustring());
}

TEST(GitException, ReportsItsStackWhenAskedForItsNarrowTextOnly)
{
    const GitException exception(MergeFailed("topic"), u"cause");
    const LogCapture log;
    static_cast<void>(exception.GetUnicodeMessageTxt());
    static_cast<void>(exception.ToUstringImpl());
    static_cast<void>(exception.GetID());
    EXPECT_THAT(log.messages(), IsEmpty());
    try
    {
        throw GitException(exception);
    }
    catch (const std::exception &raised)
    {
        static_cast<void>(raised.what());
    }
    EXPECT_THAT(log.records(),
                testing::ElementsAre(test::isRecord(
                    0x200u, fl::i18n::to_string(exception.getStackTrace().to_text()))));
}

TEST(GitException, ReportsNoStackWhereStackTracesAreDisabled)
{
    const GitException exception(MergeFailed("topic"));
    const LogCapture log(~SeverityStackTrace);
    EXPECT_EQ(exception.what(), fl::i18n::to_string(exception.GetUnicodeMessageTxt()));
    EXPECT_THAT(log.messages(), IsEmpty());
}

TEST(GitException, IsAnEmptyHolderAfterAMove)
{
    using Empty = GenericMsgIDHolder::EmptyGenericMsgIDHolder;
    GitException source(MergeFailed("topic"), u"cause");
    const GitException target(std::move(source));
    EXPECT_EQ(target.GetBaseMsgIDObj().getKey(), "MergeFailed");
    try
    {
        static_cast<void>(source.GetBaseMsgIDObj());
        ADD_FAILURE() << "nothing was raised";
    }
    catch (const Empty &empty)
    {
        EXPECT_STREQ(empty.what(), "GenericMsgIDHolder object is empty!\n");
        EXPECT_NE(dynamic_cast<const boost::exception_detail::clone_base *>(&empty), nullptr)
            << "Boost can't clone it";
    }
    EXPECT_THROW(static_cast<void>(source.GetID()), Empty);
    EXPECT_THROW(static_cast<void>(source.GetUnicodeMessageTxt()), Empty);
    EXPECT_STRNE(source.what(), "");
}

} // namespace
} // namespace vclink::git
