// SPDX-License-Identifier: MIT
#include "error/raise.hpp"

#include <exception>
#include <memory>
#include <stdexcept>
#include <string>
#include <typeinfo>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "fl/i18n/MessageCatalog.hpp"
#include "fl/i18n/VkLocale.hpp"
#include "fl/i18n/convert.hpp"
#include "support/LogCapture.hpp"
#include "vclink/git/GitException.hpp"
#include "vclink/git/messageIdentifiers.hpp"

namespace vclink::git
{
namespace
{

using namespace shared_vclink::git;
using foundation::core::except::IMsgIDException;
using foundation::core::except::IUserException;
using vclink::exception::SourceControlException;

template <class Tag> Tag makeMessage()
{
    if constexpr (std::is_default_constructible_v<Tag>)
    {
        return Tag();
    }
    else
    {
        return Tag(ustring(u"folder/file"));
    }
}

template <class Tag> class Raise : public testing::Test
{
};
using RaisedTags =
    testing::Types<HasConflicts, UnableToMergeBadRepositoryState, MergePreferenceFastForward,
                   AlreadyAdded, NoFilesToRemove, Conflicted, NoUserName>;
TYPED_TEST_SUITE(Raise, RaisedTags, );

/// Expects the exception of this identifier, and that this is its dynamic type.
template <class Tag> void expectPlain(const std::exception &exception)
{
    EXPECT_EQ(typeid(exception), typeid(TagException<Tag>));
    EXPECT_NO_THROW(std::rethrow_if_nested(exception));
}

TYPED_TEST(Raise, ThrowsTheTagsOwnExceptionOutsideAHandler)
{
    try
    {
        raise(makeMessage<TypeParam>());
    }
    catch (const TagException<TypeParam> &exception)
    {
        expectPlain<TypeParam>(exception);
        EXPECT_EQ(dynamic_cast<const std::nested_exception *>(
                      static_cast<const std::exception *>(&exception)),
                  nullptr);
        const auto message = makeMessage<TypeParam>();
        EXPECT_EQ(exception.GetBaseMsgIDObj().getKey(), message.getKey());
        EXPECT_EQ(exception.GetBaseMsgIDObj().getCatalogue(), "shared_vclink:git");
        EXPECT_TRUE(exception.GetBaseMsgIDObj().getArguments() == message.getArguments());
        EXPECT_EQ(exception.GetID(), IMsgIDException::get_error_id(message));
    }
}

TYPED_TEST(Raise, NestsTheExceptionThatIsBeingHandled)
{
    try
    {
        try
        {
            throw std::out_of_range("the cause");
        }
        catch (const std::out_of_range &)
        {
            raise(makeMessage<TypeParam>());
        }
    }
    catch (const TagException<TypeParam> &exception)
    {
        EXPECT_EQ(typeid(exception), typeid(std::_Nested_exception<TagException<TypeParam>>));
        try
        {
            std::rethrow_if_nested(exception);
            ADD_FAILURE() << "nothing is nested";
        }
        catch (const std::out_of_range &cause)
        {
            EXPECT_STREQ(cause.what(), "the cause");
        }
    }
}

TYPED_TEST(Raise, ThrowsWhatIsCaughtAsEachOfItsBases)
{
    const auto message = makeMessage<TypeParam>();
    EXPECT_THROW(raise(message), SourceControlException);
    EXPECT_THROW(raise(message), computils::exception::StackTraceRecordingException);
    EXPECT_THROW(raise(message), IMsgIDException);
    EXPECT_THROW(raise(message), IUserException);
    EXPECT_THROW(raise(message), std::exception);
    EXPECT_THROW(raise(message), boost::exception);
}

TYPED_TEST(Raise, ThrowsATextThatEveryBaseTells)
{
    const auto message = makeMessage<TypeParam>();
    const ustring text =
        fl::i18n::MessageCatalog::get_message(message, fl::i18n::VkLocale::global());
    try
    {
        raise(message);
    }
    catch (const TagException<TypeParam> &exception)
    {
        EXPECT_EQ(exception.GetUnicodeMessageTxt(), text);
        EXPECT_EQ(exception.ToUstringImpl(), text);
        EXPECT_EQ(exception.what(), fl::i18n::to_string(text));
        EXPECT_EQ(static_cast<const std::exception &>(exception).what(), fl::i18n::to_string(text));
    }
}

/// Raises HasConflicts while another exception is being handled.
[[noreturn]] void raiseNested()
{
    try
    {
        throw 42;
    }
    catch (int)
    {
        raise(HasConflicts());
    }
}

/// Expects `copy` to be HasConflicts' own class with the content of `original`.
void expectCopyWithoutNesting(const IMsgIDException &copy,
                              const TagException<HasConflicts> &original)
{
    ASSERT_EQ(typeid(copy), typeid(TagException<HasConflicts>));
    const auto &tagCopy = dynamic_cast<const TagException<HasConflicts> &>(copy);
    EXPECT_NE(&tagCopy, &original);
    EXPECT_EQ(tagCopy.GetID(), original.GetID());
    EXPECT_EQ(tagCopy.GetUnicodeMessageTxt(), original.GetUnicodeMessageTxt());
    EXPECT_EQ(tagCopy.getStackTrace().to_text(), original.getStackTrace().to_text());
    EXPECT_EQ(tagCopy.getText(), original.getText());
}

TEST(TagException, LosesNothingButTheNestingWhenRethrown)
{
    try
    {
        raiseNested();
    }
    catch (const TagException<HasConflicts> &original)
    {
        ASSERT_NE(typeid(original), typeid(TagException<HasConflicts>));
        try
        {
            static_cast<const IUserException &>(original).rethrow();
            ADD_FAILURE() << "nothing was raised";
        }
        catch (const IMsgIDException &copy)
        {
            expectCopyWithoutNesting(copy, original);
        }
    }
}

TEST(TagException, LosesNothingButTheNestingWhenCloned)
{
    try
    {
        raiseNested();
    }
    catch (const TagException<HasConflicts> &original)
    {
        const std::unique_ptr<const TagException<HasConflicts>> copy(original.clone());
        expectCopyWithoutNesting(*copy, original);
    }
}

TEST(TagException, ReportsNoStackWhenAskedForItsText)
{
    const TagException<HasConflicts> exception(HasConflicts(), SourceControlException{});
    const test::LogCapture log;
    EXPECT_STRNE(exception.what(), "");
    EXPECT_THAT(log.messages(), testing::IsEmpty());
}

TEST(TagException, HasTheStackAndTheTextOfTheBaseItWasMadeFrom)
{
    const SourceControlException base;
    const auto make = [&base] { return TagException<HasConflicts>(HasConflicts(), base); };
    EXPECT_EQ(make().getStackTrace().to_text(), base.getStackTrace().to_text());
    EXPECT_EQ(make().getText(), base.getText());
}

/// Raises, and tells where the caller goes on after the call.
[[gnu::noinline]] void raiseFromHere(const void *&returnsTo)
{
    returnsTo = __builtin_return_address(0);
    raise(NoUserName());
}

TEST(TagException, RecordsTheStackOfTheCodeThatRaisesIt)
{
    const void *returnsTo = nullptr;
    try
    {
        raiseFromHere(returnsTo);
    }
    catch (const SourceControlException &exception)
    {
        bool isThere = false;
        for (std::size_t index = 0; index < exception.getStackTrace().size(); ++index)
        {
            isThere = isThere || exception.getStackTrace().frame(index) == returnsTo;
        }
        EXPECT_TRUE(isThere);
    }
}

} // namespace
} // namespace vclink::git
