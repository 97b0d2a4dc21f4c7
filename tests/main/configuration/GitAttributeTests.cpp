// SPDX-License-Identifier: MIT
#include <cstddef>
#include <string>
#include <utility>
#include <vector>

#include <gtest/gtest.h>

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
                                          {u"", Value{u"a"}},
                                          {u"text=a", Set()}};

TEST(GitAttributeValue, IsEqualToItsCopyAndToNoOther)
{
    const auto copies = different;
    for (std::size_t i = 0; i < different.size(); ++i)
    {
        for (std::size_t j = 0; j < different.size(); ++j)
        {
            EXPECT_EQ(different[i] == copies[j], i == j) << i << ' ' << j;
            EXPECT_EQ(different[i] != copies[j], i != j) << i << ' ' << j;
        }
    }
}

TEST(GitAttributeValue, IsSerializedAsALineOfAttributesHasIt)
{
    const std::vector<std::pair<GitAttribute, std::string>> lines{
        {{u"text", Set()}, "text"},
        {{u"text", Unset()}, "-text"},
        {{u"text", Value{u"auto"}}, "text=auto"},
        {{u"text", Unspecified()}, "!text"},
        {{u"text", Value{u""}}, "text="},
        {{u"", Set()}, ""},
        {{u"", Unset()}, "-"},
        {{u"", Value{u"x"}}, "=x"},
        {{u"", Unspecified()}, "!"},
        {{u"gr\u00FC\u00DF", Value{u"\U0001F333 x=y"}}, "gr\xC3\xBC\xC3\x9F=\xF0\x9F\x8C\xB3 x=y"},
        {{vclink::test::asUtf16("caf\xE9"), Unset()}, "-caf\xE9"}};
    for (const auto &[attribute, line] : lines)
        EXPECT_EQ(serialize(attribute), line);
}

} // namespace
