// SPDX-License-Identifier: MIT
#include <exception>
#include <memory>
#include <string>

#include <boost/exception/exception.hpp>
#include <gtest/gtest.h>

#include "fl/i18n/MessageCatalog.hpp"
#include "fl/i18n/VkLocale.hpp"
#include "fl/i18n/convert.hpp"
#include "foundation/core/except/Exception.hpp"
#include "resource_core/BaseMsgID.hpp"
#include "support/Keys.hpp"
#include "vclink/exception/SourceControlException.hpp"
#include "vclink/util/exception/CancelledOperationException.hpp"

namespace
{

using computils::exception::StackTraceRecordingException;
using foundation::core::except::Exception;
using foundation::core::except::IException;
using foundation::core::except::IMsgIDException;
using foundation::core::except::IUserException;
using vclink::exception::SourceControlException;

class NoFilesToRemove : public resource_core::BaseMsgID
{
  public:
    NoFilesToRemove() : BaseMsgID({}, vclink_host_tests::catalogue, "NoFilesToRemove")
    {
    }
};

using TagException = Exception<NoFilesToRemove, SourceControlException, void>;

TagException makeException()
{
    return TagException(NoFilesToRemove(), SourceControlException());
}

ustring getExpectedText()
{
    return fl::i18n::MessageCatalog::get_message(NoFilesToRemove(), fl::i18n::VkLocale::global());
}

/// Says its text in another way than the catalogue.
class OtherWords : public TagException
{
  public:
    using TagException::TagException;
    ustring GetUnicodeMessageTxt() const override
    {
        return u"other words";
    }
};

template <class Derived, class... Bases>
constexpr bool derives = (std::is_base_of_v<Bases, Derived> && ...);
static_assert(derives<TagException, IMsgIDException, SourceControlException>);
static_assert(derives<IMsgIDException, boost::exception, IUserException>);
static_assert(derives<IUserException, IException>);
static_assert(derives<SourceControlException, StackTraceRecordingException>);
static_assert(derives<StackTraceRecordingException, std::exception>);
static_assert(
    derives<vclink::util::exception::CancelledOperationException, StackTraceRecordingException>);

} // namespace

TEST(Exceptions, TellTheirIdentifier)
{
    const TagException exception = makeException();
    EXPECT_EQ(exception.GetID(), IMsgIDException::get_error_id(NoFilesToRemove()));
    EXPECT_NE(exception.GetID().find("shared_vclink:git"), std::string::npos);
    EXPECT_NE(exception.GetID().find("NoFilesToRemove"), std::string::npos);
    EXPECT_EQ(exception.GetBaseMsgIDObj().getKey(), "NoFilesToRemove");
    EXPECT_EQ(exception.GetBaseMsgIDObj().getCatalogue(), "shared_vclink:git");
}

TEST(Exceptions, TellTheirTextInWideAndNarrowForm)
{
    const TagException exception = makeException();
    const IUserException &user = exception;
    EXPECT_EQ(user.GetUnicodeMessageTxt(), getExpectedText());
    EXPECT_EQ(user.ToUstringImpl(), getExpectedText());
    EXPECT_EQ(user.what(), fl::i18n::to_string(getExpectedText()));
    EXPECT_EQ(user.convert_str(ustring(u"\u00E4")), u"\u00E4");
    EXPECT_EQ(user.convert_str(std::string("\xC3\xA4")), u"\u00E4");
}

TEST(Exceptions, TellTheTextThatADerivedClassGives)
{
    const OtherWords exception{NoFilesToRemove(), SourceControlException()};
    EXPECT_EQ(exception.ToUstringImpl(), u"other words");
    EXPECT_STREQ(exception.what(), "other words");
    EXPECT_STREQ(static_cast<const std::exception &>(exception).what(), "other words");
}

TEST(Exceptions, AreClonedAndRethrownAsTheirOwnClassWithAllTheyHold)
{
    const TagException exception = makeException();
    const auto expectCopy = [&exception](const TagException &copy)
    {
        EXPECT_EQ(copy.GetID(), exception.GetID());
        EXPECT_EQ(copy.GetUnicodeMessageTxt(), exception.GetUnicodeMessageTxt());
        EXPECT_NE(&copy.GetBaseMsgIDObj(), &exception.GetBaseMsgIDObj());
    };
    expectCopy(*std::unique_ptr<const TagException>(exception.clone()));
    const boost::exception_detail::clone_base &base = exception;
    try
    {
        base.rethrow();
        FAIL() << "nothing was raised";
    }
    catch (const TagException &copy)
    {
        expectCopy(copy);
    }
}

TEST(Exceptions, AreCaughtAcrossTheBoundaryOfTheLibrary)
{
    EXPECT_THROW(throw makeException(), SourceControlException);
    EXPECT_THROW(throw makeException(), IUserException);
    EXPECT_THROW(throw makeException(), boost::exception);
    EXPECT_THROW(throw vclink::util::exception::CancelledOperationException(),
                 computils::exception::StackTraceRecordingException);
}

TEST(Exceptions, HoldNoNestedExceptionAfterTheyWereCloned)
{
    try
    {
        try
        {
            throw 1;
        }
        catch (...)
        {
            std::throw_with_nested(makeException());
        }
    }
    catch (const TagException &nested)
    {
        EXPECT_NE(dynamic_cast<const std::nested_exception *>(&nested), nullptr);
        EXPECT_THROW(std::rethrow_if_nested(nested), int);
        const std::unique_ptr<const TagException> copy(nested.clone());
        EXPECT_EQ(dynamic_cast<const std::nested_exception *>(copy.get()), nullptr);
    }
}
