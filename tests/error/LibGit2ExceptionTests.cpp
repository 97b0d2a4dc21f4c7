// SPDX-License-Identifier: MIT
#include "vclink/git/LibGit2Exception.hpp"

#include <memory>
#include <string>
#include <typeinfo>

#include <boost/variant/get.hpp>
#include <gtest/gtest.h>

#include "error/HermeticLibGit2.hpp"
#include "error/makeError.hpp"
#include "fl/i18n/convert.hpp"
#include "vclink/git/messageIdentifiers.hpp"

namespace vclink::git
{
namespace
{

using test::HermeticLibGit2;
using test::makeError;

void expectFailure(const LibGit2Exception &exception, int code, int errorClass, const ustring &text)
{
    EXPECT_EQ(exception.getError().getCode(), code);
    EXPECT_EQ(exception.getError().getErrorClass(), errorClass);
    EXPECT_EQ(exception.getError().getMessage(), text);
    const auto &message = exception.GetBaseMsgIDObj();
    EXPECT_EQ(message.getCatalogue(), "shared_vclink:git");
    EXPECT_EQ(message.getKey(), "LibGit2Error");
    ASSERT_EQ(message.getArguments().size(), 3u);
    EXPECT_EQ(boost::get<long>(message.getArguments()[0]), code);
    EXPECT_EQ(boost::get<long>(message.getArguments()[1]), errorClass);
    EXPECT_EQ(boost::get<ustring>(message.getArguments()[2]), text);
}

TEST(LibGit2Exception, TellsCodeClassAndMessage)
{
    const HermeticLibGit2 libgit2;
    const LibGit2Exception exception(makeError(-13, GIT_ERROR_CHECKOUT, "1 conflict"));
    expectFailure(exception, -13, GIT_ERROR_CHECKOUT, u"1 conflict");
    const std::string text = exception.what();
    EXPECT_NE(text.find("1 conflict"), std::string::npos) << text;
    EXPECT_NE(text.find("-13"), std::string::npos) << text;
    EXPECT_EQ(exception.GetUnicodeMessageTxt(), fl::i18n::utf8_to_ustring(text));
}

TEST(LibGit2Exception, HasNoAddedText)
{
    const HermeticLibGit2 libgit2;
    const LibGit2Exception exception(makeError(-13, GIT_ERROR_CHECKOUT, "1 conflict"));
    EXPECT_EQ(exception.GetUnicodeMessageTxt(),
              GitException(exception.GetBaseMsgIDObj()).GetUnicodeMessageTxt());
}

TEST(LibGit2Exception, IsNamedByItsMessageAndNotByTheCode)
{
    const HermeticLibGit2 libgit2;
    const LibGit2Exception one(makeError(-1, GIT_ERROR_NET, "one"));
    const LibGit2Exception two(makeError(-3, GIT_ERROR_REFERENCE, "two"));
    EXPECT_EQ(one.GetID(), two.GetID());
    EXPECT_NE(one.GetID().find("shared_vclink:git"), std::string::npos);
    EXPECT_NE(one.GetID().find("LibGit2Error"), std::string::npos);
}

TEST(LibGit2Exception, KeepsTheFailureThroughAClone)
{
    const HermeticLibGit2 libgit2;
    auto original =
        std::make_unique<LibGit2Exception>(makeError(-13, GIT_ERROR_CHECKOUT, "1 conflict"));
    const GitException &asBase = *original;
    const std::unique_ptr<const GitException> clone(asBase.clone());
    original.reset();
    const GitException &cloned = *clone;
    ASSERT_EQ(typeid(cloned), typeid(LibGit2Exception));
    expectFailure(dynamic_cast<const LibGit2Exception &>(cloned), -13, GIT_ERROR_CHECKOUT,
                  u"1 conflict");
}

TEST(LibGit2Exception, RethrowsACopyOfItself)
{
    const HermeticLibGit2 libgit2;
    const LibGit2Exception original(makeError(-13, GIT_ERROR_CHECKOUT, "1 conflict"));
    try
    {
        static_cast<const GitException &>(original).rethrow();
        ADD_FAILURE() << "nothing was raised";
    }
    catch (const GitException &copy)
    {
        EXPECT_NE(&copy, &original);
        ASSERT_EQ(typeid(copy), typeid(LibGit2Exception));
        expectFailure(dynamic_cast<const LibGit2Exception &>(copy), -13, GIT_ERROR_CHECKOUT,
                      u"1 conflict");
        EXPECT_EQ(copy.getStackTrace().to_text(), original.getStackTrace().to_text());
    }
}

} // namespace
} // namespace vclink::git
