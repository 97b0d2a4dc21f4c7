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
#include "support/isRecord.hpp"
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

TEST(RethrowAsGitException, AddsTheTextOfTheException)
{
    const MergeFailed inner("inner");
    const ustring whole = catalogueText(MergeFailed("topic"));
    EXPECT_EQ(textOfReplacement([] { throw std::runtime_error("disk f\xC3\xBCll"); }),
              whole + u"\ndisk f\u00FCll");
    EXPECT_EQ(
        textOfReplacement([] { boost::throw_exception(std::out_of_range("beyond the end")); }),
        whole + u"\nbeyond the end");
    // A localized text goes before what().
    EXPECT_EQ(textOfReplacement([] { throw TwoTexts(); }), whole + u"\nlocalized text");
    EXPECT_EQ(textOfReplacement([] { raise(HasConflicts()); }),
              whole + u"\n" + catalogueText(HasConflicts()));
    EXPECT_EQ(textOfReplacement([&inner] { throw GitException(inner, u"cause"); }),
              whole + u"\n" + catalogueText(inner) + u"\ncause");
    EXPECT_EQ(textOfReplacement([] { throw std::runtime_error(""); }), whole);
}

TEST(RethrowAsGitException, LetsAnExceptionOfAnotherTypePassUnchanged)
{
    for (const auto &thrown : {std::make_exception_ptr(42), std::make_exception_ptr(BoostOnly())})
    {
        std::exception_ptr passed;
        try
        {
            try
            {
                std::rethrow_exception(thrown);
            }
            catch (...)
            {
                rethrowAsGitException(MergeFailed("topic"));
            }
        }
        catch (...)
        {
            passed = std::current_exception();
        }
        EXPECT_EQ(passed, thrown);
    }
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
    EXPECT_THAT(log.records(), ElementsAre(test::isRecord(0x10u, expected)));
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
