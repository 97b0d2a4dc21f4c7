// SPDX-License-Identifier: MIT
#include "vclink/git/LibGit2Exception.hpp"

#include <memory>
#include <string>

#include <boost/variant/get.hpp>
#include <gtest/gtest.h>

#include "error/HermeticLibGit2.hpp"
#include "error/exceptions.hpp"
#include "error/makeError.hpp"
#include "fl/i18n/convert.hpp"
#include "vclink/git/messageIdentifiers.hpp"

namespace vclink::git
{
namespace
{

using test::makeError;

class LibGit2ExceptionTest : public testing::Test
{
  protected:
    static void expectConflict(const LibGit2Exception &exception)
    {
        EXPECT_THAT(exception.getError(), test::isError(-13, GIT_ERROR_CHECKOUT, u"1 conflict"));
        const auto &message = exception.GetBaseMsgIDObj();
        EXPECT_EQ(message.getCatalogue(), "shared_vclink:git");
        EXPECT_EQ(message.getKey(), "LibGit2Error");
        ASSERT_EQ(message.getArguments().size(), 3u);
        EXPECT_EQ(boost::get<long>(message.getArguments()[0]), -13);
        EXPECT_EQ(boost::get<long>(message.getArguments()[1]), GIT_ERROR_CHECKOUT);
        EXPECT_EQ(boost::get<ustring>(message.getArguments()[2]), u"1 conflict");
    }

  private:
    const test::HermeticLibGit2 libgit2_{};
};

TEST_F(LibGit2ExceptionTest, TellsCodeClassAndMessageWithoutAnAddedText)
{
    const LibGit2Exception exception(makeError(-13, GIT_ERROR_CHECKOUT, "1 conflict"));
    expectConflict(exception);
    const std::string text = exception.what();
    EXPECT_NE(text.find("1 conflict"), std::string::npos) << text;
    EXPECT_NE(text.find("-13"), std::string::npos) << text;
    EXPECT_EQ(exception.GetUnicodeMessageTxt(), fl::i18n::utf8_to_ustring(text));
    EXPECT_EQ(exception.GetUnicodeMessageTxt(),
              GitException(exception.GetBaseMsgIDObj()).GetUnicodeMessageTxt());
}

TEST_F(LibGit2ExceptionTest, IsNamedByItsMessageAndNotByTheCode)
{
    const LibGit2Exception one(makeError(-1, GIT_ERROR_NET, "one"));
    const LibGit2Exception two(makeError(-3, GIT_ERROR_REFERENCE, "two"));
    EXPECT_EQ(one.GetID(), two.GetID());
    EXPECT_NE(one.GetID().find("shared_vclink:git"), std::string::npos);
    EXPECT_NE(one.GetID().find("LibGit2Error"), std::string::npos);
}

TEST_F(LibGit2ExceptionTest, IsClonedAndRethrownWithItsFailureAndOutlived)
{
    auto original =
        std::make_unique<LibGit2Exception>(makeError(-13, GIT_ERROR_CHECKOUT, "1 conflict"));
    test::expectCopies(*original, expectConflict);
    const GitException &asBase = *original;
    const std::unique_ptr<const GitException> clone(asBase.clone());
    original.reset();
    expectConflict(dynamic_cast<const LibGit2Exception &>(*clone));
}

} // namespace
} // namespace vclink::git
