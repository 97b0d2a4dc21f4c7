// SPDX-License-Identifier: MIT
#include "error/errorUtil/rethrowAsGitException.hpp"

#include <exception>
#include <stdexcept>
#include <string>
#include <typeinfo>

#include <boost/exception/exception.hpp>
#include <boost/throw_exception.hpp>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "error/catalogueText.hpp"
#include "error/logging/severity.hpp"
#include "error/raise.hpp"
#include "support/LogCapture.hpp"
#include "support/diagnosticText.hpp"
#include "vclink/git/GitException.hpp"
#include "vclink/git/messageIdentifiers.hpp"

namespace vclink::git
{
namespace
{

using shared_vclink::git::HasConflicts;
using shared_vclink::git::MergeFailed;
using test::catalogueText;
using test::diagnosticTextOf;
using test::LogCapture;
using testing::ElementsAre;

/// A user's exception that is a std::exception of another text, too.
struct TwoTexts : foundation::core::except::IMsgIDException, std::exception
{
    const TwoTexts *clone() const override
    {
        return std::make_unique<TwoTexts>(*this).release();
    }
    void rethrow() const override
    {
        throw TwoTexts(*this);
    }
    const char *what() const noexcept override
    {
        return "narrow text";
    }
    std::string GetID() const override
    {
        return "id";
    }
    ustring GetUnicodeMessageTxt() const override
    {
        return u"localized text";
    }
    const resource_core::BaseMsgID &GetBaseMsgIDObj() const override
    {
        static const HasConflicts message;
        return message;
    }
};

struct BoostOnly : virtual boost::exception
{
};

/// Throws with `raiseIt`, replaces the exception, and gives the text of what comes out.
template <class Raise> ustring textOfReplacement(Raise raiseIt)
{
    try
    {
        try
        {
            raiseIt();
        }
        catch (...)
        {
            rethrowAsGitException(MergeFailed("topic"));
        }
    }
    catch (const GitException &exception)
    {
        EXPECT_EQ(typeid(exception), typeid(GitException));
        EXPECT_EQ(exception.GetBaseMsgIDObj().getKey(), "MergeFailed");
        EXPECT_TRUE(exception.GetBaseMsgIDObj().getArguments() ==
                    MergeFailed("topic").getArguments());
        return exception.GetUnicodeMessageTxt();
    }
    ADD_FAILURE() << "nothing was raised";
    return ustring();
}

TEST(RethrowAsGitException, AddsTheWhatOfAStandardException)
{
    EXPECT_EQ(textOfReplacement([] { throw std::runtime_error("disk f\xC3\xBCll"); }),
              catalogueText(MergeFailed("topic")) + u"\ndisk f\u00FCll");
}

TEST(RethrowAsGitException, AddsTheWhatOfAnExceptionOfBoostToo)
{
    EXPECT_EQ(
        textOfReplacement([] { boost::throw_exception(std::out_of_range("beyond the end")); }),
        catalogueText(MergeFailed("topic")) + u"\nbeyond the end");
}

TEST(RethrowAsGitException, PrefersTheLocalizedTextOfAUsersException)
{
    EXPECT_EQ(textOfReplacement([] { throw TwoTexts(); }),
              catalogueText(MergeFailed("topic")) + u"\nlocalized text");
}

TEST(RethrowAsGitException, AddsTheLocalizedTextOfATagException)
{
    EXPECT_EQ(textOfReplacement([] { raise(HasConflicts()); }),
              catalogueText(MergeFailed("topic")) + u"\n" + catalogueText(HasConflicts()));
}

TEST(RethrowAsGitException, AddsTheWholeTextOfAGitException)
{
    const MergeFailed inner("inner");
    EXPECT_EQ(textOfReplacement([&inner] { throw GitException(inner, u"cause"); }),
              catalogueText(MergeFailed("topic")) + u"\n" + catalogueText(inner) + u"\ncause");
}

TEST(RethrowAsGitException, AddsNothingForAnEmptyText)
{
    EXPECT_EQ(textOfReplacement([] { throw std::runtime_error(""); }),
              catalogueText(MergeFailed("topic")));
}

TEST(RethrowAsGitException, LetsAnExceptionOfAnotherTypePassUnchanged)
{
    const int *thrown = nullptr;
    try
    {
        try
        {
            throw 42;
        }
        catch (const int &number)
        {
            thrown = &number;
            rethrowAsGitException(MergeFailed("topic"));
        }
    }
    catch (const int &number)
    {
        EXPECT_EQ(&number, thrown);
        EXPECT_EQ(number, 42);
        return;
    }
    ADD_FAILURE() << "nothing was raised";
}

TEST(RethrowAsGitException, LetsAnExceptionThatIsBoostsOnlyPassUnchanged)
{
    try
    {
        try
        {
            throw BoostOnly();
        }
        catch (const BoostOnly &)
        {
            rethrowAsGitException(MergeFailed("topic"));
        }
    }
    catch (const BoostOnly &exception)
    {
        EXPECT_EQ(typeid(exception), typeid(BoostOnly));
        return;
    }
    ADD_FAILURE() << "nothing was raised";
}

/// Throws `exception`, replaces it, and expects one record with the text of it.
template <class Exception> void expectReported(const Exception &exception)
{
    const LogCapture log(SeverityException | SeverityDiagnostic | SeverityParameter);
    const std::string expected = "Exception caught: " + diagnosticTextOf(exception);
    try
    {
        try
        {
            throw exception;
        }
        catch (...)
        {
            rethrowAsGitException(HasConflicts());
        }
    }
    catch (...)
    {
        // What comes out is for the other tests.
    }
    const auto records = log.records();
    ASSERT_EQ(records.size(), 1u);
    EXPECT_EQ(records[0].severity, 0x10u);
    EXPECT_EQ(records[0].message, expected);
}

TEST(RethrowAsGitException, ReportsTheExceptionThatItReplaces)
{
    expectReported(std::runtime_error("cause"));
    expectReported(TwoTexts());
    expectReported(42);
}

TEST(RethrowAsGitException, ReportsTheTextOfTheExceptionVerbosely)
{
    const LogCapture log(SeverityException);
    static_cast<void>(textOfReplacement([] { throw std::runtime_error("the cause"); }));
    EXPECT_THAT(log.messages(),
                ElementsAre(testing::AllOf(testing::StartsWith("Exception caught: "),
                                           testing::HasSubstr("std::runtime_error"),
                                           testing::HasSubstr("the cause"))));
}

TEST(RethrowAsGitException, WritesNoRecordWhenTheSeverityIsDisabled)
{
    const LogCapture log(~SeverityException & ~SeverityStackTrace);
    static_cast<void>(textOfReplacement([] { throw std::runtime_error("cause"); }));
    EXPECT_THAT(log.messages(), testing::IsEmpty());
}

} // namespace
} // namespace vclink::git
