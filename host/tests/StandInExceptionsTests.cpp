// SPDX-License-Identifier: MIT
#include <cstring>
#include <stdexcept>

#include <gtest/gtest.h>

#include "foundation/core/except/Exception.hpp"
#include "support/Keys.hpp"
#include "support/LocaleOfTheProcess.hpp"
#include "vclink/exception/SourceControlException.hpp"
#include "vclink/util/exception/CancelledOperationException.hpp"

namespace stand_in_exceptions
{

using foundation::core::except::Exception;
using foundation::core::except::IException;
using vclink::exception::SourceControlException;

class Tag : public resource_core::BaseMsgID
{
  public:
    Tag() : BaseMsgID({}, vclink_host_tests::catalogue, "NoFilesToRemove")
    {
    }
};

using TagException = Exception<Tag, SourceControlException, void>;

class Plain : public IException
{
  public:
    Plain() = default;
    const Plain *clone() const override
    {
        return new Plain(*this);
    }
    void rethrow() const override
    {
        throw Plain(*this);
    }
};

/// Cannot produce its text, and throws what no one would expect.
class Speechless : public TagException
{
  public:
    using TagException::TagException;
    ustring GetUnicodeMessageTxt() const override
    {
        throw 1;
    }
};

} // namespace stand_in_exceptions

using namespace stand_in_exceptions;

TEST(StandInExceptions, SayTheirClassWhenTheyHaveNoText)
{
    EXPECT_STREQ(Plain().what(), "stand_in_exceptions::Plain");
    EXPECT_STREQ(Speechless(Tag(), SourceControlException()).what(),
                 "stand_in_exceptions::Speechless");
    EXPECT_TRUE(noexcept(Plain().what()));
}

TEST(StandInExceptions, NameCatalogueAndKeyAndProduceTheirTextWhenTheyAreAskedForIt)
{
    const TagException exception{Tag(), SourceControlException()};
    EXPECT_EQ(exception.GetID(), "shared_vclink:git:NoFilesToRemove");
    const struct
    {
        const char *locale;
        const char *text;
    } rows[] = {{"C", "There are no files to remove. Nothing was changed."},
                {"de_DE.UTF-8", "Es gibt keine Dateien zu entfernen. Es wurde nichts geändert."},
                {"ja", "削除するファイルがありません。何も変更されていません。"}};
    for (const auto &row : rows)
    {
        const vclink::test::LocaleOfTheProcess locale(row.locale);
        EXPECT_STREQ(exception.what(), row.text);
    }
}

TEST(StandInExceptions, KeepTheTextOfACopyApart)
{
    const TagException one{Tag(), SourceControlException()};
    const char *const text = one.what();
    const std::string before = text;
    TagException other = one;
    other = one;
    EXPECT_STREQ(other.what(), before.c_str());
    EXPECT_NE(other.what(), text);
    EXPECT_STREQ(text, before.c_str());
}

TEST(StandInExceptions, SayThatTheOperationWasCancelled)
{
    EXPECT_STREQ(vclink::util::exception::CancelledOperationException().what(),
                 "The operation was cancelled.");
}
