// SPDX-License-Identifier: MIT
#include <string>
#include <vector>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "main/files/StatusCallbacks.hpp"
#include "options/Callbacks.hpp"
#include "support/text.hpp"

namespace
{

using testing::ElementsAre;
using vclink::FileState;
using vclink::git::StatusCallbacks;
using vclink::test::asBytes;

std::vector<std::string> keys(const StatusCallbacks &callbacks)
{
    std::vector<std::string> names;
    for (const auto &entry : callbacks.states)
        names.push_back(asBytes(entry.first));
    return names;
}

TEST(StatusCallbacks, BeginsWithACopyOfTheRootAndNoStates)
{
    const upath root(u"/root", false);
    const StatusCallbacks callbacks(root);
    EXPECT_EQ(callbacks.root, root);
    EXPECT_FALSE(callbacks.root.native());
    EXPECT_NE(&callbacks.root, &root);
    EXPECT_TRUE(callbacks.states.empty());
}

TEST(StatusCallbacks, NotesTheStateUnderTheRootAndTheName)
{
    StatusCallbacks callbacks(upath(u"/root", false));
    EXPECT_EQ(callbacks.status("sub/file", GIT_STATUS_WT_MODIFIED), 0);
    ASSERT_EQ(callbacks.states.size(), 1U);
    const auto &[path, state] = *callbacks.states.begin();
    EXPECT_EQ(path.string(), u"/root/sub/file");
    EXPECT_FALSE(path.native());
    EXPECT_EQ(state.getState(), FileState::Modified);
}

TEST(StatusCallbacks, LetsTheWalkGoOnWhateverTheFlags)
{
    StatusCallbacks callbacks(upath(u"/root"));
    for (unsigned flags = 1; flags != 0; flags <<= 1)
        EXPECT_EQ(callbacks.status(std::to_string(flags).c_str(), flags), 0);
    EXPECT_EQ(callbacks.states.size(), 32U);
}

TEST(StatusCallbacks, KeepsTheFirstOfTwoReportsOfAPath)
{
    StatusCallbacks callbacks(upath(u"/root"));
    EXPECT_EQ(callbacks.status("file", GIT_STATUS_INDEX_NEW), 0);
    EXPECT_EQ(callbacks.status("file", GIT_STATUS_WT_DELETED), 0);
    EXPECT_EQ(callbacks.status("other", GIT_STATUS_WT_DELETED), 0);
    EXPECT_EQ(callbacks.status("file", GIT_STATUS_CURRENT), 0);
    EXPECT_THAT(keys(callbacks), ElementsAre("/root/file", "/root/other"));
    EXPECT_EQ(callbacks.states.begin()->second.getState(), FileState::Added);
}

TEST(StatusCallbacks, CutsFlagsAboveSixteenBits)
{
    const auto stateOf = [](unsigned flags)
    {
        StatusCallbacks callbacks(upath(u"/root"));
        callbacks.status("file", flags);
        return callbacks.states.begin()->second.getState();
    };
    EXPECT_EQ(stateOf(0x10000), FileState::Clean);
    EXPECT_EQ(stateOf(0xFFFF0000), FileState::Clean);
    EXPECT_EQ(stateOf(0xFFFF0000 | GIT_STATUS_WT_NEW), FileState::Unversioned);
    EXPECT_EQ(stateOf(0xFFFFFFFF), FileState::InConflict);
}

TEST(StatusCallbacks, SortsByElementsInWhateverOrderThePathsCome)
{
    for (const auto &order : {std::vector<const char *>{"a-b/x", "a.b", "a/x", "a", "b"},
                              std::vector<const char *>{"b", "a", "a/x", "a.b", "a-b/x"},
                              std::vector<const char *>{"a/x", "b", "a-b/x", "a", "a.b"}})
    {
        StatusCallbacks callbacks(upath(u"/root"));
        for (const auto *name : order)
            callbacks.status(name, GIT_STATUS_CURRENT);
        EXPECT_THAT(keys(callbacks),
                    ElementsAre("/root/a", "/root/a/x", "/root/a-b/x", "/root/a.b", "/root/b"));
    }
}

TEST(StatusCallbacks, SortsElementsByCodeUnitsAndNotByBytes)
{
    // U+FF5E is one code unit above the surrogates of U+1F333, and comes before it in UTF-8.
    StatusCallbacks callbacks(upath(u"/root"));
    for (const auto *name : {"\xEF\xBD\x9E", "\xF0\x9F\x8C\xB3"})
        callbacks.status(name, GIT_STATUS_CURRENT);
    EXPECT_THAT(keys(callbacks), ElementsAre("/root/\xF0\x9F\x8C\xB3", "/root/\xEF\xBD\x9E"));
}

TEST(StatusCallbacks, IsReachedThroughTheBridge)
{
    StatusCallbacks callbacks(upath(u"/root"));
    const git_status_cb bridge =
        vclink::git::makeCallback<&StatusCallbacks::status, git_status_cb>();
    EXPECT_EQ(bridge("file", GIT_STATUS_WT_NEW, &callbacks), 0);
    EXPECT_EQ(callbacks.states.begin()->second.getState(), FileState::Unversioned);
}

} // namespace
