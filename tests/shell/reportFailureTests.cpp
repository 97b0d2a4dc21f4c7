// SPDX-License-Identifier: MIT
#include <stdexcept>

#include <gtest/gtest.h>

#include "examples/shell/failures.hpp"
#include "fl/i18n/VkLocale.hpp"
#include "fl/i18n/convert.hpp"
#include "vclink/git/GitException.hpp"
#include "vclink/git/messageIdentifiers.hpp"
#include "vclink/util/exception/CancelledOperationException.hpp"
#include "vclink_host/locale.hpp"

namespace vclink::test
{
namespace
{

struct Report
{
    int status;
    std::string errors;
};

/// What is told of an exception that is in flight.
template <class Exception> Report report(const Exception &exception)
{
    testing::internal::CaptureStderr();
    try
    {
        throw exception;
    }
    catch (...)
    {
        const int status = shell::reportFailure();
        return {status, testing::internal::GetCapturedStderr()};
    }
}

TEST(ReportFailure, EndsWith130WhenThePersonCancelled)
{
    const Report told = report(util::exception::CancelledOperationException());
    EXPECT_EQ(told.status, 130);
    EXPECT_EQ(told.errors, "vclink-shell: The operation was cancelled.\n");
}

TEST(ReportFailure, NamesTheCancellationInTheLanguageOfTheLocale)
{
    const struct
    {
        std::string locale;
        std::string text;
    } cases[] = {{"de_AT.UTF-8", "Der Vorgang wurde abgebrochen.\n"},
                 {"de", "Der Vorgang wurde abgebrochen.\n"},
                 {"ja_JP", "操作はキャンセルされました。\n"},
                 {"den", "The operation was cancelled.\n"},
                 {"C", "The operation was cancelled.\n"}};
    const fl::i18n::VkLocale before = fl::i18n::VkLocale::global();
    for (const auto &[locale, text] : cases)
    {
        vclink_host::setGlobalLocale(fl::i18n::VkLocale(locale));
        const Report told = report(util::exception::CancelledOperationException());
        EXPECT_EQ(told.status, 130);
        EXPECT_EQ(told.errors, "vclink-shell: " + text);
    }
    vclink_host::setGlobalLocale(before);
}

TEST(ReportFailure, TellsTheLocalizedTextWithTheAddedOne)
{
    const git::GitException exception(shared_vclink::git::MergeFailed("topic"),
                                      u"the reason\33\n\tand its end");
    const Report told = report(exception);
    EXPECT_EQ(told.status, 1);
    EXPECT_EQ(told.errors, "vclink-shell: " +
                               fl::i18n::ustring_to_utf8(
                                   git::GitException(shared_vclink::git::MergeFailed("topic"))
                                       .GetUnicodeMessageTxt()) +
                               "\nthe reason\\033\n\tand its end\n");
}

TEST(ReportFailure, TellsTheWordsOfAnyOtherException)
{
    const Report told = report(std::runtime_error("no luck"));
    EXPECT_EQ(told.status, 1);
    EXPECT_EQ(told.errors, "vclink-shell: no luck\n");
}

TEST(ReportFailure, SaysSoWhenAnExceptionHasNoWords)
{
    const Report told = report(7);
    EXPECT_EQ(told.status, 1);
    EXPECT_EQ(told.errors, "vclink-shell: The command ended with an error of an unknown kind.\n");
}

} // namespace
} // namespace vclink::test
