// SPDX-License-Identifier: MIT
#include "error/raise.hpp"

#include <exception>
#include <stdexcept>
#include <string>
#include <typeinfo>
#include <utility>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "error/catalogueText.hpp"
#include "error/exceptions.hpp"
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
        return Tag();
    else
        return Tag(ustring(u"folder/file"));
}

template <class Tag> class Raise : public testing::Test
{
};
using RaisedTags =
    testing::Types<HasConflicts, UnableToMergeBadRepositoryState, MergePreferenceFastForward,
                   AlreadyAdded, NoFilesToRemove, Conflicted, NoUserName>;
TYPED_TEST_SUITE(Raise, RaisedTags, );

TYPED_TEST(Raise, ThrowsTheTagsOwnExceptionOutsideAHandlerWithATextThatEveryBaseTells)
{
    const auto message = makeMessage<TypeParam>();
    const ustring text = test::catalogueText(message);
    try
    {
        raise(message);
    }
    catch (const TagException<TypeParam> &exception)
    {
        const std::exception &base = exception;
        EXPECT_EQ(typeid(base), typeid(TagException<TypeParam>));
        EXPECT_EQ(dynamic_cast<const std::nested_exception *>(&base), nullptr);
        EXPECT_EQ(exception.GetBaseMsgIDObj().getKey(), message.getKey());
        EXPECT_EQ(exception.GetBaseMsgIDObj().getCatalogue(), "shared_vclink:git");
        EXPECT_TRUE(exception.GetBaseMsgIDObj().getArguments() == message.getArguments());
        EXPECT_EQ(exception.GetID(), IMsgIDException::get_error_id(message));
        EXPECT_EQ(exception.GetUnicodeMessageTxt(), text);
        EXPECT_EQ(exception.ToUstringImpl(), text);
        EXPECT_EQ(exception.what(), fl::i18n::to_string(text));
        EXPECT_EQ(base.what(), fl::i18n::to_string(text));
    }
}

/// What std::throw_with_nested throws; each standard library has its own name for it.
template <class Exception> const std::type_info &nestedType(Exception exception)
{
    try
    {
        std::throw_with_nested(std::move(exception));
    }
    catch (const Exception &thrown)
    {
        return typeid(thrown);
    }
}

/// Raises a message while `cause` is being handled.
template <class Tag> [[noreturn]] void raiseNested(const std::exception_ptr &cause)
{
    try
    {
        std::rethrow_exception(cause);
    }
    catch (...)
    {
        raise(makeMessage<Tag>());
    }
}

TYPED_TEST(Raise, NestsTheExceptionThatIsBeingHandled)
{
    const auto cause = std::make_exception_ptr(std::out_of_range("the cause"));
    try
    {
        raiseNested<TypeParam>(cause);
    }
    catch (const TagException<TypeParam> &exception)
    {
        EXPECT_EQ(typeid(exception), nestedType(TagException<TypeParam>(exception)));
        const auto *const nested = dynamic_cast<const std::nested_exception *>(
            static_cast<const std::exception *>(&exception));
        ASSERT_NE(nested, nullptr);
        EXPECT_EQ(nested->nested_ptr(), cause);
    }
}

TYPED_TEST(Raise, ThrowsWhatIsCaughtAsEachOfItsBases)
{
    test::expectCaughtAs<SourceControlException, computils::exception::StackTraceRecordingException,
                         IMsgIDException, IUserException, std::exception, boost::exception>(
        [] { raise(makeMessage<TypeParam>()); });
}

TEST(TagException, LosesNothingButTheNestingWhenClonedOrRethrown)
{
    try
    {
        raiseNested<HasConflicts>(std::make_exception_ptr(42));
    }
    catch (const TagException<HasConflicts> &original)
    {
        ASSERT_NE(typeid(original), typeid(TagException<HasConflicts>));
        test::expectCopies(original,
                           [&original](const TagException<HasConflicts> &copy)
                           {
                               EXPECT_EQ(copy.GetID(), original.GetID());
                               EXPECT_EQ(copy.GetUnicodeMessageTxt(),
                                         original.GetUnicodeMessageTxt());
                               EXPECT_EQ(copy.getText(), original.getText());
                           });
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
    EXPECT_EQ(test::framesOf(make()), test::framesOf(base));
    EXPECT_EQ(make().getText(), base.getText());
}

/// Throws, and returns where the caller continues after the call.
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
        EXPECT_THAT(test::framesOf(exception), testing::Contains(returnsTo));
    }
}

} // namespace
} // namespace vclink::git
