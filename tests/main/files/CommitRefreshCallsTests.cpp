// SPDX-License-Identifier: MIT
#include <algorithm>
#include <chrono>
#include <filesystem>
#include <string>
#include <vector>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "CommitCallsFixture.hpp"

namespace
{

using testing::Contains;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::Not;
using namespace vclink::test;

/// The calls between those that open the index and those that write it.
class RefreshOfACommit : public CommitCallsFixture
{
  protected:
    void replaceByFolder(const std::string &name) const
    {
        repository_.remove(name);
        repository_.write(name + "/untracked", "x");
    }

    /// Files that are older than the index, of which one has another time than the index noted.
    RepositoryState::Entries indexOfTouched(const std::string &name) const
    {
        const auto past = std::filesystem::file_time_type::clock::now() - std::chrono::hours(1);
        for (const auto *file : {"file", "other", "sub/inside"})
            std::filesystem::last_write_time(repository_ / file, past);
        repository_.git({"update-index", "--refresh"});
        std::filesystem::last_write_time(repository_ / name, past - std::chrono::hours(1));
        return indexOf(repository_);
    }
};

TEST_F(RefreshOfACommit, ComesAfterWhatChangedIsStagedByItsPath)
{
    repository_.write("file", "changed\n");
    repository_.write("new", "x");
    repository_.remove("other");
    startNoting();
    commitOnce();
    const auto steps = calls_->steps();
    const auto begin = std::find(steps.begin(), steps.end(), "git_repository_index");
    ASSERT_GE(steps.end() - begin, 10);
    EXPECT_THAT(std::vector<std::string>(begin, begin + 10),
                ElementsAre("git_repository_index", "git_index_caps", "git_index_caps",
                            "git_diff_options_init", "git_diff_index_to_workdir",
                            "git_index_remove_bypath", "git_index_add_bypath", "git_diff_free",
                            "git_index_update_all", "git_index_write"));
    EXPECT_THAT(namesIn(), ElementsAre("file", "sub/inside"));
    EXPECT_EQ(committed("file"), "changed\n");
}

/// The refresh alone knows in which order attributes and files count.
TEST_F(RefreshOfACommit, StagesEverythingItselfBesideChangedAttributes)
{
    repository_.commitAll(writes("sub/.gitattributes", "* text\n"), "attributes");
    repository_.write("file", "changed\n");
    repository_.remove("sub/.gitattributes");
    startNoting();
    commitOnce();
    EXPECT_THAT(calls_->steps(), Not(Contains("git_index_add_bypath")));
    EXPECT_THAT(calls_->steps(), Not(Contains("git_index_remove_bypath")));
    EXPECT_THAT(namesIn(), ElementsAre("file", "other", "sub/inside"));
}

TEST_F(RefreshOfACommit, PassesOverFilesThatOnlyLookChanged)
{
    const auto before = indexOfTouched("file");
    bool isHeld = false;
    startNoting();
    calls_->on<git_index_update_all>(
        [&](git_index *index, const git_strarray *, git_index_matched_path_cb, void *)
        { isHeld = (git_index_get_bypath(index, "file", 0)->flags & GIT_INDEX_ENTRY_VALID) != 0; });
    commitOnce();
    EXPECT_TRUE(isHeld);
    EXPECT_EQ(indexOf(repository_), before);
}

TEST_F(RefreshOfACommit, DoesAllTheWorkWhenAPathFails)
{
    for (const auto *name :
         {"git_diff_index_to_workdir", "git_index_add_bypath", "git_index_remove_bypath"})
    {
        repository_.write("file", name);
        repository_.write("other", "x");
        repository_.add({"other"});
        repository_.remove("other");
        startNoting();
        calls_->fail({{name, -42}});
        commitOnce();
        EXPECT_THAT(calls_->steps(), Contains("git_index_read")) << name;
        EXPECT_THAT(calls_->openHandles(), IsEmpty());
        EXPECT_EQ(committed("file"), name);
        EXPECT_THAT(namesIn(), ElementsAre("file", "sub/inside"));
    }
}

TEST_F(RefreshOfACommit, RaisesAFailureToReadTheIndexAgain)
{
    repository_.write("file", "changed\n");
    const NothingChanges nothing(repository_);
    startNoting();
    calls_->fail({{"git_index_add_bypath", -41}, {"git_index_read", -42}});
    EXPECT_EQ(failureOf([this] { commitOnce(); }), (Failure{-42, GIT_ERROR_OS, "injected"}));
    EXPECT_THAT(calls_->openHandles(), IsEmpty());
}

TEST_F(RefreshOfACommit, ReadsTheIndexFileAgainOnlyWhenItDropsAnEntry)
{
    startNoting();
    repository_.write("file", "changed\n");
    repository_.write("new", "x");
    repository_.remove("sub/inside");
    commitOnce();
    // Once for the lock.
    EXPECT_THAT(calls_->steps(), Contains("git_index_open").Times(1));
    startNoting();
    replaceByFolder("file");
    commitOnce();
    EXPECT_THAT(calls_->steps(), Contains("git_index_open").Times(2));
    EXPECT_THAT(calls_->steps(), Not(Contains("git_index_add")));
    EXPECT_THAT(calls_->openHandles(), IsEmpty());
}

TEST_F(RefreshOfACommit, ReadsTheIndexFileAgainBeforeItIsWritten)
{
    replaceByFolder("file");
    startNoting();
    commitOnce();
    auto steps = calls_->steps();
    const auto lookUps = std::remove(steps.begin(), steps.end(), "git_index_find");
    EXPECT_EQ(steps.end() - lookUps, 3) << "once for each entry that was there";
    steps.erase(lookUps, steps.end());
    const auto begin = std::find(steps.begin(), steps.end(), "git_repository_index");
    ASSERT_GE(steps.end() - begin, 5);
    EXPECT_THAT(std::vector<std::string>(begin, begin + 5),
                ElementsAre("git_repository_index", "git_index_update_all", "git_index_open",
                            "git_index_free", "git_index_write"));
}

TEST_F(RefreshOfACommit, PassesOverWhatIsNotCheckedOut)
{
    repository_.git({"update-index", "--skip-worktree", "file", "sub/inside"});
    const auto before = indexOf(repository_);
    for (const auto *name : {"file", "other"})
        repository_.remove(name);
    startNoting();
    commitOnce();
    EXPECT_THAT(calls_->steps(), Not(Contains("git_index_add")));
    auto without = before;
    without.erase("other");
    EXPECT_EQ(indexOf(repository_), without);
    EXPECT_THAT(namesIn(), ElementsAre("file", "sub/inside"));
}

/// What is staged by its path, and what the refresh alone stages.
TEST_F(RefreshOfACommit, StagesItselfWhatDependsOnOtherEntries)
{
    beginMerge({"conflicted"});
    repository_.write("conflicted", "resolved\n");
    repository_.write("file", "changed\n");
    repository_.remove("other");
    repository_.symlink("file", "other");
    std::vector<std::string> staged;
    startNoting();
    calls_->on<git_index_add_bypath>([&staged](git_index *, const char *path)
                                     { staged.emplace_back(path); });
    commitOnce();
    EXPECT_THAT(staged, ElementsAre("file"));
    EXPECT_EQ(committed("conflicted"), "resolved\n");
    EXPECT_EQ(committed("other"), "file");
    EXPECT_THAT(status(), IsEmpty());
}

TEST_F(RefreshOfACommit, StagesEverythingItselfWhereNamesOfAnyCaseAreOne)
{
    repository_.git({"config", "core.ignoreCase", "true"});
    repository_.write("file", "changed\n");
    startNoting();
    commitOnce();
    EXPECT_THAT(calls_->steps(), Not(Contains("git_index_add_bypath")));
    EXPECT_EQ(committed("file"), "changed\n");
}

/// The same size, and as far as whole seconds tell the same time.
TEST_F(RefreshOfACommit, TakesWhatIsSavedAfterAPathIsStaged)
{
    repository_.write("file", "changed\n");
    startNoting();
    calls_->on<git_index_update_all>(
        [this](git_index *, const git_strarray *, git_index_matched_path_cb, void *)
        { repository_.write("file", "CHANGED\n"); });
    commitOnce();
    EXPECT_THAT(calls_->steps(), Contains("git_index_add_bypath"));
    EXPECT_EQ(committed("file"), "CHANGED\n");
    EXPECT_THAT(status(), IsEmpty());
}

/// A program that removes the file and creates it to save it: in between, and only then, the commit
/// finds it gone.
TEST_F(RefreshOfACommit, RefusesADeletionOfAFileThatComesBack)
{
    for (const auto *name : {"other", "sub/inside"})
    {
        const std::string content = repository_.read(name);
        repository_.remove(name);
        startNoting();
        calls_->on<git_index_update_all>(
            [&](git_index *, const git_strarray *, git_index_matched_path_cb, void *)
            { repository_.write(name, content); });
        const auto head = idOf("HEAD");
        const auto index = indexOf(repository_);
        EXPECT_EQ(failureOf([this] { commitOnce(); }),
                  (Failure{GIT_ERROR, GIT_ERROR_OS,
                           std::string("could not read '") + name +
                               "', which is tracked: Input/output error"}));
        EXPECT_THAT(calls_->steps(), Contains("git_index_remove_bypath"));
        EXPECT_THAT(calls_->openHandles(), IsEmpty());
        calls_.reset();
        EXPECT_EQ(idOf("HEAD"), head);
        EXPECT_EQ(indexOf(repository_), index);
    }
}

/// Three stages become one entry, and none is gone.
TEST_F(RefreshOfACommit, PutsNothingBackWhenAConflictEnds)
{
    beginMerge({"file"});
    startNoting();
    commitOnce();
    EXPECT_THAT(calls_->steps(), Contains("git_index_open").Times(2));
    EXPECT_THAT(calls_->steps(), Not(Contains("git_index_add")));
    EXPECT_THAT(namesIn(), ElementsAre("file", "other", "sub/inside"));
}

} // namespace
