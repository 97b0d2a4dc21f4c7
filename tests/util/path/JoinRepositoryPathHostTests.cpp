// SPDX-License-Identifier: MIT
// What a host is asked when a name that Git reported is appended to a path.
#include <string>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "fl/filesystem/detail/path_text.hpp"
#include "fl/i18n/convert.hpp"
#include "util/path/paths.hpp"

namespace
{

struct Call
{
    ustring path;
    ustring name;
    bool native;
};

std::vector<Call> &calls()
{
    static std::vector<Call> all;
    return all;
}

} // namespace

/// Stands in the place of the host's. Like some hosts it resolves "." and "..".
void fl::filesystem::detail::concatenate_pathname(ustring &path, const ustring &name, bool native)
{
    calls().push_back({path, name, native});
    if (name == u"..")
    {
        path.erase(path.rfind(u'/'));
    }
    else if (name != u".")
    {
        path += u'/' + name;
    }
}

namespace
{

using vclink::git::joinRepositoryPath;

class JoinRepositoryPathHost : public testing::Test
{
  protected:
    JoinRepositoryPathHost()
    {
        calls().clear();
    }
};

TEST_F(JoinRepositoryPathHost, IsGivenTheRootTheWholeNameAndTheRootsBoolean)
{
    for (const std::string name : {"a", "sub/file.txt", "a/name/longer/than/a/short/string/holds",
                                   ".gitignore", "..a", "\xC3\xBC/x", "\xFF", "C:a", "/", "a\\b"})
    {
        for (const bool native : {false, true})
        {
            calls().clear();
            joinRepositoryPath(upath(u"/some/root", native), name.c_str());
            ASSERT_EQ(calls().size(), 1U) << name;
            EXPECT_EQ(calls().front().path, u"/some/root") << name;
            EXPECT_EQ(calls().front().name, fl::i18n::utf8_to_ustring(name)) << name;
            EXPECT_EQ(calls().front().native, native) << name;
        }
    }
}

TEST_F(JoinRepositoryPathHost, IsAskedNothingForAnEmptyName)
{
    EXPECT_EQ(joinRepositoryPath(upath(u"/root"), "").string(), u"/root");
    EXPECT_TRUE(calls().empty());
}

TEST_F(JoinRepositoryPathHost, MayTreatDotsApartWithoutAKeyOutsideTheRoot)
{
    for (const std::string name : {".gitignore", ".a/b", "..a", "...", ".a"})
    {
        EXPECT_EQ(joinRepositoryPath(upath(u"/root"), name.c_str()).string(),
                  u"/root/" + fl::i18n::utf8_to_ustring(name));
    }
}

} // namespace
