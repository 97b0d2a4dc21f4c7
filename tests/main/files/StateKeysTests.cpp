// SPDX-License-Identifier: MIT
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "main/AdapterFixture.hpp"
#include "support/text.hpp"

namespace
{

using vclink::ApplicationInteractor;
using namespace vclink::test;

class StateKeys : public AdapterFixture
{
  protected:
    StateKeys()
    {
        repository_.commitAll(writes("sub/file", "x"), "first");
        repository_.symlink("repository", "../link");
    }

    std::string onlyKey(const std::string &root, const std::string &file) const
    {
        const auto states = makeAdapter(root)->getFileStates({asPath(file)});
        EXPECT_EQ(states.size(), 1U) << root << " and " << file;
        return states.empty() ? std::string() : asBytes(states.begin()->first);
    }

    GitRepository repository_ = makeRepository();
    const std::string real_ = repository_.path();
    const std::string link_ = folder() / "link";
};

TEST_F(StateKeys, EqualTheHostsPathsThatBeginWithTheRootsText)
{
    const upath file = asPath(real_ + "/sub/file");
    const auto states = makeAdapter(real_)->getFileStates({file});
    EXPECT_EQ(states.count(file), 1U);
    EXPECT_EQ(makeAdapter(real_)->getFolderStates(asPath(real_)).count(file), 1U);
}

TEST_F(StateKeys, BeginWithTheRootsVeryText)
{
    EXPECT_EQ(onlyKey(real_ + "/", real_ + "/sub/file"), real_ + "/sub/file");
    EXPECT_EQ(onlyKey(real_ + "/./", real_ + "/sub/file"), real_ + "/./sub/file");
    EXPECT_EQ(onlyKey(real_ + "/sub/..", real_ + "/sub/file"), real_ + "/sub/../sub/file");
}

TEST_F(StateKeys, AreTheSameFilesUnderEitherNameOfTheRoot)
{
    EXPECT_EQ(onlyKey(link_, link_ + "/sub/file"), link_ + "/sub/file");
    EXPECT_EQ(onlyKey(link_, real_ + "/sub/file"), link_ + "/sub/file");
    EXPECT_EQ(onlyKey(real_, link_ + "/sub/file"), real_ + "/sub/file");
    const auto states = makeAdapter(link_)->getFolderStates(asPath(real_ + "/sub"));
    EXPECT_EQ(statesBelow(link_, states), (States{{"sub/file", "Clean"}}));
}

TEST_F(StateKeys, CarryTheRootsBoolean)
{
    for (const bool native : {true, false})
    {
        const upath root(asPath(real_).string(), native);
        vclink::git::GitAdapter adapter(
            root, std::static_pointer_cast<ApplicationInteractor>(interactor_));
        const auto states = adapter.getFolderStates(root);
        ASSERT_EQ(states.size(), 1U);
        EXPECT_EQ(states.begin()->first.native(), native);
    }
}

TEST_F(StateKeys, HoldEveryNameThatAFileCanHave)
{
    const std::vector<std::string> names{"a b",
                                         " lead",
                                         "trail ",
                                         "tab\t",
                                         "line\n",
                                         "quote\"",
                                         "single'",
                                         "back\\slash",
                                         "star*",
                                         "what?",
                                         "[x]",
                                         "#hash",
                                         "!bang",
                                         "-dash",
                                         "\xFF",
                                         "gr\xC3\xBC",
                                         "\xF0\x9F\x8C\xB3",
                                         "\x01",
                                         "~",
                                         "sub/\xFE",
                                         "{a,b}",
                                         "a:b",
                                         "$x"};
    for (const auto &name : names)
        repository_.write(name, "x");
    States expected{{"sub/file", "Clean"}};
    for (const auto &name : names)
        expected.emplace(name, "Unversioned");
    EXPECT_EQ(allStates(repository_), expected);
}

TEST_F(StateKeys, LeadTheHostBackToEveryFileButOneWithABackslash)
{
    const std::vector<std::string> names{"a b",  "trail ",     "line\n", "#hash",  "!bang",
                                         "\xFF", "gr\xC3\xBC", "cr\r",   "\ttab\t"};
    for (const auto &name : names)
        repository_.write(name, "x");
    for (const auto &name : names)
        EXPECT_EQ(states(repository_, {name}), (States{{name, "Unversioned"}}));
    repository_.write("back\\slash", "x");
    EXPECT_EQ(states(repository_, {"back\\slash"}), States());
}

TEST_F(StateKeys, LieBelowARootWhoseNameIsNoUtf8)
{
    const auto odd = makeRepository("odd \xFF");
    odd.write("file", "x");
    EXPECT_EQ(onlyKey(odd.path(), odd / "file"), (odd / "file").string());
}

} // namespace
