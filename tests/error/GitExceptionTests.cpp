// SPDX-License-Identifier: MIT
#include "vclink/git/GitException.hpp"

#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <typeinfo>
#include <utility>
#include <vector>

#include <boost/exception/exception.hpp>
#include <boost/variant/get.hpp>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "error/catalogueText.hpp"
#include "error/logging/severity.hpp"
#include "fl/i18n/convert.hpp"
#include "support/LogCapture.hpp"
#include "vclink/git/messageIdentifiers.hpp"

namespace vclink::git
{
namespace
{

using computils::exception::StackTraceRecordingException;
using foundation::core::except::IException;
using foundation::core::except::IMsgIDException;
using foundation::core::except::IUserException;
using resource_core::GenericMsgIDHolder;
using shared_vclink::git::LibGit2Error;
using shared_vclink::git::MergeFailed;
using test::catalogueText;
using test::LogCapture;
using testing::IsEmpty;

std::vector<const void *> framesOf(const StackTraceRecordingException &exception)
{
    std::vector<const void *> frames;
    for (std::size_t index = 0; index < exception.getStackTrace().size(); ++index)
    {
        frames.push_back(exception.getStackTrace().frame(index));
    }
    return frames;
}

/// Makes an exception, and tells where the caller goes on after the call.
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

TEST(GitException, HasTheCataloguesTextWhenNothingIsAdded)
{
    const MergeFailed message("topic");
    EXPECT_EQ(GitException(message).GetUnicodeMessageTxt(), catalogueText(message));
    EXPECT_EQ(GitException(message, u"").GetUnicodeMessageTxt(), catalogueText(message));
    EXPECT_NE(catalogueText(message).back(), u'\n');
}

TEST(GitException, HasTheAddedTextAfterOneLineFeed)
{
    const MergeFailed message("topic");
    EXPECT_EQ(GitException(message, u"cause\n").GetUnicodeMessageTxt(),
              catalogueText(message) + u"\ncause\n");
}

TEST(GitException, GivesItsTextInEveryWay)
{
    const GitException exception(MergeFailed("Z\xC3\xBCrich"), u"\u6771\u4EAC");
    const ustring text = exception.GetUnicodeMessageTxt();
    EXPECT_EQ(exception.ToUstringImpl(), text);
    const std::string narrow = fl::i18n::to_string(text);
    EXPECT_EQ(exception.what(), narrow);
    EXPECT_EQ(static_cast<const IException &>(exception).what(), narrow);
    EXPECT_EQ(static_cast<const std::exception &>(exception).what(), narrow);
}

TEST(GitException, ConvertsTextsAsEveryUsersException)
{
    const GitException exception(MergeFailed("topic"));
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

TEST(GitException, IsCopiedDeeply)
{
    auto original = std::make_unique<GitException>(MergeFailed("topic"), u"cause");
    const GitException copy(*original);
    expectSameContent(copy, *original);
    original.reset();
    EXPECT_EQ(copy.GetUnicodeMessageTxt(), catalogueText(MergeFailed("topic")) + u"\ncause");
}

TEST(GitException, ClonesItselfToTheHeap)
{
    const GitException original(MergeFailed("topic"), u"cause");
    const boost::exception_detail::clone_base &asBase = original;
    const std::unique_ptr<const boost::exception_detail::clone_base> clone(asBase.clone());
    ASSERT_NE(clone.get(), &asBase);
    const boost::exception_detail::clone_base &cloned = *clone;
    EXPECT_EQ(typeid(cloned), typeid(GitException));
    expectSameContent(dynamic_cast<const GitException &>(cloned), original);
}

TEST(GitException, RethrowsACopyOfItself)
{
    const GitException original(MergeFailed("topic"), u"cause");
    try
    {
        static_cast<const IUserException &>(original).rethrow();
        ADD_FAILURE() << "nothing was raised";
    }
    catch (const GitException &copy)
    {
        EXPECT_NE(&copy, &original);
        EXPECT_EQ(typeid(copy), typeid(GitException));
        expectSameContent(copy, original);
    }
}

TEST(GitException, IsCaughtAsEachOfItsBases)
{
    const auto raise = [] { throw GitException(MergeFailed("topic")); };
    EXPECT_THROW(raise(), IMsgIDException);
    EXPECT_THROW(raise(), IUserException);
    EXPECT_THROW(raise(), IException);
    EXPECT_THROW(raise(), boost::exception);
    EXPECT_THROW(raise(), vclink::exception::SourceControlException);
    EXPECT_THROW(raise(), StackTraceRecordingException);
    EXPECT_THROW(raise(), std::exception);
}

TEST(GitException, RecordsTheStackOfTheCodeThatRaisesIt)
{
    const void *returnsTo = nullptr;
    const GitException exception = makeException(returnsTo);
    const std::vector<const void *> frames = framesOf(exception);
    std::size_t raising = 0;
    while (raising < frames.size() && frames[raising] != returnsTo)
    {
        ++raising;
    }
    ASSERT_LT(raising, frames.size()) << "the caller of the raising function is not there";
    ASSERT_GT(raising, 0u);
    const auto inside = reinterpret_cast<std::uintptr_t>(frames[raising - 1]);
    const auto function = reinterpret_cast<std::uintptr_t>(&makeException);
    EXPECT_GT(inside, function);
    EXPECT_LT(inside, function + 0x10000);
    EXPECT_EQ(exception.getText(), ustring());
}

TEST(GitException, KeepsTheStackOfItsMakingWhenCopiedElsewhere)
{
    const void *returnsTo = nullptr;
    const GitException original = makeException(returnsTo);
    const auto copyElsewhere = [&original] { return GitException(original); };
    EXPECT_EQ(framesOf(copyElsewhere()), framesOf(original));
}

TEST(GitException, ReportsItsStackWhenAskedForItsNarrowText)
{
    const LogCapture log;
    try
    {
        throw GitException(MergeFailed("topic"));
    }
    catch (const std::exception &exception)
    {
        EXPECT_THAT(log.messages(), IsEmpty());
        static_cast<void>(exception.what());
        const auto &raised = dynamic_cast<const GitException &>(exception);
        const auto records = log.records();
        ASSERT_EQ(records.size(), 1u);
        EXPECT_EQ(records[0].severity, 0x200u);
        EXPECT_EQ(records[0].message, fl::i18n::to_string(raised.getStackTrace().to_text()));
    }
}

TEST(GitException, ReportsNoStackForItsOtherTexts)
{
    const GitException exception(MergeFailed("topic"), u"cause");
    const LogCapture log;
    static_cast<void>(exception.GetUnicodeMessageTxt());
    static_cast<void>(exception.ToUstringImpl());
    static_cast<void>(exception.GetID());
    EXPECT_THAT(log.messages(), IsEmpty());
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
    GitException source(MergeFailed("topic"), u"cause");
    const GitException target(std::move(source));
    EXPECT_EQ(target.GetBaseMsgIDObj().getKey(), "MergeFailed");
    try
    {
        static_cast<void>(source.GetBaseMsgIDObj());
        ADD_FAILURE() << "nothing was raised";
    }
    catch (const GenericMsgIDHolder::EmptyGenericMsgIDHolder &empty)
    {
        EXPECT_STREQ(empty.what(), "GenericMsgIDHolder object is empty!\n");
        EXPECT_NE(dynamic_cast<const boost::exception_detail::clone_base *>(&empty), nullptr)
            << "Boost can't clone it";
    }
    EXPECT_THROW(static_cast<void>(source.GetID()), GenericMsgIDHolder::EmptyGenericMsgIDHolder);
    EXPECT_THROW(static_cast<void>(source.GetUnicodeMessageTxt()),
                 GenericMsgIDHolder::EmptyGenericMsgIDHolder);
    EXPECT_STRNE(source.what(), "");
}

} // namespace
} // namespace vclink::git
