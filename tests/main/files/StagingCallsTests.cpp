// SPDX-License-Identifier: MIT
#include <string>
#include <vector>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "StagingFixture.hpp"
#include "main/callNames.hpp"
#include "support/libgit2/LibGit2Recorder.hpp"
#include "util/path/pathspecEscape.hpp"

namespace
{

using shared_vclink::git::AlreadyAdded;
using shared_vclink::git::NoFilesToRemove;
using testing::Contains;
using testing::ElementsAre;
using testing::IsEmpty;
using vclink::git::TagException;
using namespace vclink::test;
using Names = std::vector<std::string>;

const Names ofTheOpening{"git_repository_open_ext"};
const Names ofTheLock{"git_index_open", "git_repository_set_index", "git_index_set_caps",
                      "git_index_free"};
const Names beforeTheAddition = ofTheOpening + ofTheSettings + ofTheLock;
const Names ofTheEnd{"git_index_free", "git_repository_free"};
/// The second call asks whether case matters.
const Names ofTheIndex{"git_repository_index", "git_index_caps"};
const Names ofTheAddition =
    beforeTheAddition + ofTheIndex + Names{"git_index_add_all", "git_index_write"} + ofTheEnd;
const Names ofTheRemoval = ofTheOpening + ofTheLock + ofTheIndex +
                           Names{"git_index_remove_all", "git_index_write"} + ofTheEnd;

/// What an index call was given.
struct AskedOfIndex
{
    Names pathspec;
    unsigned flags = 99;
    git_index_matched_path_cb callback = nullptr;
    void *payload = nullptr;
};

/// The calls of libgit2 that staging makes.
class StagingCalls : public StagingFixture
{
  protected:
    StagingCalls()
    {
        repository_.write("new", "x");
        calls_.clear();
        calls_.on<git_index_add_all>(
            [this](git_index *, const git_strarray *pathspec, unsigned flags,
                   git_index_matched_path_cb callback, void *payload) {
                additions_.push_back({textsOf(pathspec), flags, callback, payload});
            });
        calls_.on<git_index_remove_all>(
            [this](git_index *, const git_strarray *pathspec, git_index_matched_path_cb callback,
                   void *payload) {
                removals_.push_back({textsOf(pathspec), 99, callback, payload});
            });
    }

    static Names textsOf(const git_strarray *pathspec)
    {
        return {pathspec->strings, pathspec->strings + pathspec->count};
    }
    void add(const Names &names) const
    {
        adapter_->addFiles(files(names));
    }
    void remove(const Names &names) const
    {
        adapter_->removeFiles(files(names));
    }
    void markResolved(const std::string &name) const
    {
        adapter_->markResolved(files({name}).front());
    }

    std::unique_ptr<vclink::git::GitAdapter> adapter_ = makeAdapter(repository_.path());
    LibGit2Recorder calls_;
    std::vector<AskedOfIndex> additions_;
    std::vector<AskedOfIndex> removals_;
};

TEST_F(StagingCalls, OfAnAdditionFollowThoseOfTheQuery)
{
    add({"new"});
    EXPECT_EQ(calls_.steps(), ofTheQuery + ofTheAddition);
    EXPECT_THAT(calls_.openHandles(), IsEmpty());
}

/// libgit2 compares the text of each changed file.
TEST_F(StagingCalls, OfAnAdditionHoldWhatElseHasChanged)
{
    repository_.write("file", "changed and longer\n");
    repository_.remove("other");
    const auto expected = indexOf(repository_);
    std::vector<unsigned> held;
    calls_.on<git_index_add_all>(
        [&held](git_index *index, const git_strarray *, unsigned, git_index_matched_path_cb, void *)
        {
            for (const auto *name : {"file", "other", "sub/inside"})
                held.push_back(git_index_get_bypath(index, name, 0)->flags & GIT_INDEX_ENTRY_VALID);
        });
    add({"new"});
    const Names prepare{"git_pathspec_new", "git_index_caps", "git_pathspec_matches_path",
                        "git_pathspec_matches_path", "git_pathspec_free"};
    const Names addition{"git_index_add_all", "git_index_write"};
    EXPECT_EQ(calls_.steps(),
              ofTheQuery + beforeTheAddition + ofTheIndex + prepare + addition + ofTheEnd);
    EXPECT_THAT(calls_.openHandles(), IsEmpty());
    EXPECT_THAT(held, ElementsAre(GIT_INDEX_ENTRY_VALID, GIT_INDEX_ENTRY_VALID, 0U));
    auto after = indexOf(repository_);
    EXPECT_EQ(after.erase("new"), 1U);
    EXPECT_EQ(after, expected);
}

TEST_F(StagingCalls, OfAModifiedFileMarkedAsResolvedStageItByItsPath)
{
    repository_.write("file", "changed and longer\n");
    repository_.write("other", "changed, too\n");
    const auto expected = stateAfterGit({{"add", "file"}}).index;
    for (const auto *failing : {"git_index_add_bypath", "git_diff_index_to_workdir"})
    {
        calls_.fail({{failing, -42}});
        markResolved("file");
        EXPECT_THAT(calls_.steps(), Contains("git_index_read"));
        EXPECT_EQ(indexOf(repository_), expected) << failing;
        repository_.git({"restore", "--staged", "file"});
    }
    calls_.fail({});
    calls_.clear();
    markResolved("file");
    EXPECT_THAT(calls_.steps(), Contains("git_index_add_bypath").Times(1));
    EXPECT_EQ(indexOf(repository_), expected);
    EXPECT_THAT(calls_.openHandles(), IsEmpty());
}

TEST_F(StagingCalls, OfARemovalFollowThoseOfTheQuery)
{
    remove({"file"});
    EXPECT_EQ(calls_.steps(), ofTheQuery + ofTheRemoval);
    EXPECT_THAT(calls_.openHandles(), IsEmpty());
}

TEST_F(StagingCalls, OfAFileMarkedAsResolvedAreThoseOfItsAdditionOrRemoval)
{
    markResolved("new");
    EXPECT_EQ(calls_.steps(), ofTheAddition);
    calls_.clear();
    markResolved("missing");
    EXPECT_EQ(calls_.steps(), ofTheRemoval);
    EXPECT_THAT(calls_.openHandles(), IsEmpty());
}

TEST_F(StagingCalls, OfAnAdditionOrARemovalHaveTheFilesAndNoFlag)
{
    repository_.write("#a", "x");
    repository_.write("sub/new", "x");
    add({"sub/new", "new", "#a", "missing"});
    remove({"sub/inside", "file", "new"});
    ASSERT_EQ(removals_.size(), 1U);
    EXPECT_THAT(removals_[0].pathspec, ElementsAre("file", "new", "sub/inside"));
    EXPECT_EQ(removals_[0].payload, adapter_.get());
    ASSERT_EQ(additions_.size(), 1U);
    EXPECT_THAT(additions_[0].pathspec,
                ElementsAre(vclink::git::escapePathspec("#a"), "new", "sub/new"));
    EXPECT_EQ(additions_[0].flags, 0U);
    EXPECT_EQ(additions_[0].flags, static_cast<unsigned>(GIT_INDEX_ADD_DEFAULT));
    EXPECT_EQ(additions_[0].payload, adapter_.get());
}

TEST_F(StagingCalls, OfAFileMarkedAsResolvedHaveThisFile)
{
    markResolved("file");
    markResolved("gone");
    ASSERT_EQ(additions_.size(), 1U);
    ASSERT_EQ(removals_.size(), 1U);
    EXPECT_THAT(additions_[0].pathspec, ElementsAre("file"));
    EXPECT_EQ(additions_[0].flags, static_cast<unsigned>(GIT_INDEX_ADD_DEFAULT));
    EXPECT_THAT(removals_[0].pathspec, ElementsAre("gone"));
}

/// The callback may be given anything, and reads nothing of it.
TEST_F(StagingCalls, AcceptEveryPath)
{
    add({"new"});
    remove({"file"});
    for (const AskedOfIndex &asked : {additions_.at(0), removals_.at(0)})
    {
        ASSERT_NE(asked.callback, nullptr);
        EXPECT_EQ(asked.callback("path", "pattern", asked.payload), 0);
        EXPECT_EQ(asked.callback("", nullptr, nullptr), 0);
        EXPECT_EQ(asked.callback(nullptr, nullptr, nullptr), 0);
    }
}

TEST_F(StagingCalls, AreNoneForAnEmptyList)
{
    adapter_->addFiles({});
    EXPECT_THROW(adapter_->removeFiles({}), TagException<NoFilesToRemove>);
    EXPECT_THAT(calls_.steps(), IsEmpty());
}

TEST_F(StagingCalls, AreThoseOfTheQueryAloneWhereNothingIsLeftToDo)
{
    add({"missing"});
    EXPECT_EQ(calls_.steps(), ofTheQuery);
    calls_.clear();
    EXPECT_THROW(remove({"missing"}), TagException<NoFilesToRemove>);
    EXPECT_EQ(calls_.steps(), ofTheQuery);
}

TEST_F(StagingCalls, AreThoseOfTheQueryAloneWhereAFileIsRefused)
{
    EXPECT_THROW(add({"new", "file"}), TagException<AlreadyAdded>);
    EXPECT_EQ(calls_.steps(), ofTheQuery);
    EXPECT_THAT(calls_.openHandles(), IsEmpty());
}

} // namespace
