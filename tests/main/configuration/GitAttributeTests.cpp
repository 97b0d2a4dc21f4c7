// SPDX-License-Identifier: MIT
#include <cstddef>
#include <string>
#include <type_traits>
#include <variant>
#include <vector>

#include <gtest/gtest.h>

#include "error/VirtualTable.hpp"
#include "support/text.hpp"
#include "vclink/git/GitAttribute.hpp"

namespace
{

using vclink::git::GitAttribute;
using vclink::git::serialize;
using Set = GitAttribute::Set;
using Unset = GitAttribute::Unset;
using Value = GitAttribute::Value;
using Unspecified = GitAttribute::Unspecified;

const std::vector<GitAttribute> different{{u"text", Set()},
                                          {u"text", Unset()},
                                          {u"text", Unspecified()},
                                          {u"text", Value{u""}},
                                          {u"text", Value{u"a"}},
                                          {u"text", Value{u"A"}},
                                          {u"text", Value{u"a "}},
                                          {u"text", Value{u"set"}},
                                          {u"text", Value{u"unspecified"}},
                                          {u"merge", Set()},
                                          {u"merge", Unset()},
                                          {u"merge", Unspecified()},
                                          {u"merge", Value{u""}},
                                          {u"merge", Value{u"a"}},
                                          {u"Text", Set()},
                                          {u"", Set()},
                                          {u"", Unspecified()},
                                          {u"text=a", Set()}};

TEST(GitAttributeValue, IsEqualToItselfAndToNoOther)
{
    for (std::size_t i = 0; i < different.size(); ++i)
    {
        for (std::size_t j = 0; j < different.size(); ++j)
        {
            EXPECT_EQ(different[i] == different[j], i == j) << i << ' ' << j;
            EXPECT_EQ(different[i] != different[j], i != j) << i << ' ' << j;
        }
    }
}

TEST(GitAttributeValue, IsEqualToItsCopy)
{
    for (const GitAttribute &attribute : different)
    {
        const GitAttribute copy = attribute;
        EXPECT_TRUE(copy == attribute);
        EXPECT_FALSE(copy != attribute);
    }
}

TEST(GitAttributeValue, DiffersInItsNameAlone)
{
    EXPECT_TRUE((GitAttribute{u"a", Unspecified()} != GitAttribute{u"b", Unspecified()}));
    EXPECT_TRUE((GitAttribute{u"a", Value{u"x"}} != GitAttribute{u"b", Value{u"x"}}));
}

TEST(GitAttributeValue, IsSerializedAsALineOfAttributesHasIt)
{
    EXPECT_EQ(serialize({u"text", Set()}), "text");
    EXPECT_EQ(serialize({u"text", Unset()}), "-text");
    EXPECT_EQ(serialize({u"text", Value{u"auto"}}), "text=auto");
    EXPECT_EQ(serialize({u"text", Unspecified()}), "!text");
}

TEST(GitAttributeValue, IsSerializedWithAnEmptyValue)
{
    EXPECT_EQ(serialize({u"text", Value{u""}}), "text=");
}

TEST(GitAttributeValue, IsSerializedWithoutAName)
{
    EXPECT_EQ(serialize({u"", Set()}), "");
    EXPECT_EQ(serialize({u"", Unset()}), "-");
    EXPECT_EQ(serialize({u"", Value{u"x"}}), "=x");
    EXPECT_EQ(serialize({u"", Unspecified()}), "!");
}

TEST(GitAttributeValue, IsSerializedInUtf8)
{
    EXPECT_EQ(serialize({u"gr\u00FC\u00DF", Value{u"\U0001F333 x=y"}}),
              "gr\xC3\xBC\xC3\x9F=\xF0\x9F\x8C\xB3 x=y");
    const std::string bytes = "caf\xE9";
    EXPECT_EQ(serialize({vclink::test::asUtf16(bytes), Unset()}), '-' + bytes);
}

TEST(GitAttributeValue, HasItsMembersInOrder)
{
    const GitAttribute attribute{u"name", Value{u"value"}};
    EXPECT_EQ(vclink::test::offsetIn(attribute, attribute.name), 0);
    EXPECT_EQ(static_cast<std::size_t>(vclink::test::offsetIn(attribute, attribute.attributeValue)),
              sizeof(ustring));
    EXPECT_FALSE(std::is_polymorphic_v<GitAttribute>);
}

TEST(GitAttributeValue, HasItsAlternativesInOrder)
{
    using States = decltype(GitAttribute::attributeValue);
    EXPECT_EQ(std::variant_size_v<States>, 4U);
    EXPECT_TRUE((std::is_same_v<std::variant_alternative_t<0, States>, Set>));
    EXPECT_TRUE((std::is_same_v<std::variant_alternative_t<1, States>, Unset>));
    EXPECT_TRUE((std::is_same_v<std::variant_alternative_t<2, States>, Value>));
    EXPECT_TRUE((std::is_same_v<std::variant_alternative_t<3, States>, Unspecified>));
}

} // namespace
