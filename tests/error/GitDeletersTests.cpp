// SPDX-License-Identifier: MIT
#include "error/errorUtil/OwnedHandle.hpp"

#include <string>
#include <type_traits>
#include <utility>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "error/errorUtil/GitResult.hpp"
#include "support/GitFixture.hpp"
#include "support/LibGit2Session.hpp"
#include "support/libgit2/LibGit2Recorder.hpp"

namespace vclink::git
{
namespace
{

using testing::ElementsAre;
using testing::IsEmpty;

template <class... Handles>
constexpr bool releasesAll = (std::is_invocable_r_v<void, const GitDeleters &, Handles *> && ...);
static_assert(
    releasesAll<git_annotated_commit, git_branch_iterator, git_commit, git_config, git_index,
                git_index_conflict_iterator, git_object, git_odb, git_odb_object, git_reference,
                git_remote, git_repository, git_signature, git_tree>);
static_assert(!std::is_invocable_v<GitDeleters, git_blob *> &&
              !std::is_invocable_v<GitDeleters, void *>);
static_assert(std::is_empty_v<GitDeleters>, "an owning handle is as large as a pointer");
static_assert(std::is_same_v<OwnedHandle<git_tree>, std::unique_ptr<git_tree, GitDeleters>>);

class GitDeletersTest : public test::GitFixture
{
  protected:
    GitDeletersTest()
    {
        test::GitRepository copy = makeRepository();
        copy.write("file", "text");
        copy.commitAll("first");
        repository_ = acquire<git_repository>(git_repository_open, copy.path().c_str()).value();
        git_oid id;
        git_reference_name_to_id(&id, repository_.get(), "HEAD");
        commit_ = acquire<git_commit>(git_commit_lookup, repository_.get(), &id).value();
    }

    /// Expects that the handle is released once, by this function.
    template <class Handle>
    static void expectReleasedBy(const std::string &function, GitResult<OwnedHandle<Handle>> made)
    {
        OwnedHandle<Handle> handle = std::move(made).value();
        const void *const raw = handle.get();
        ASSERT_NE(raw, nullptr) << function;
        const test::LibGit2Recorder recorder;
        handle.reset();
        ASSERT_THAT(recorder.names(), ElementsAre(function));
        EXPECT_EQ(recorder.calls().front().handle, raw);
    }

    git_repository *repository() const
    {
        return repository_.get();
    }
    git_commit *commit() const
    {
        return commit_.get();
    }

  private:
    test::LibGit2Session session_{environment()};
    OwnedHandle<git_repository> repository_;
    OwnedHandle<git_commit> commit_;
};

TEST_F(GitDeletersTest, ReleasesEachHandleByItsFunction)
{
    const git_oid *const id = git_commit_id(commit());
    const auto store = acquire<git_odb>(git_repository_odb, repository()).value();
    const auto index = acquire<git_index>(git_repository_index, repository()).value();
    expectReleasedBy("git_commit_free", acquire<git_commit>(git_commit_lookup, repository(), id));
    expectReleasedBy("git_object_free",
                     acquire<git_object>(git_object_lookup, repository(), id, GIT_OBJECT_ANY));
    expectReleasedBy("git_tree_free", acquire<git_tree>(git_commit_tree, commit()));
    expectReleasedBy("git_annotated_commit_free",
                     acquire<git_annotated_commit>(git_annotated_commit_lookup, repository(), id));
    expectReleasedBy("git_odb_object_free", acquire<git_odb_object>(git_odb_read, store.get(), id));
    expectReleasedBy(
        "git_repository_free",
        acquire<git_repository>(git_repository_open, git_repository_path(repository())));
    expectReleasedBy("git_config_free", acquire<git_config>(git_repository_config, repository()));
    expectReleasedBy("git_odb_free", acquire<git_odb>(git_repository_odb, repository()));
    expectReleasedBy("git_index_free", acquire<git_index>(git_repository_index, repository()));
    expectReleasedBy(
        "git_index_conflict_iterator_free",
        acquire<git_index_conflict_iterator>(git_index_conflict_iterator_new, index.get()));
    expectReleasedBy("git_reference_free",
                     acquire<git_reference>(git_repository_head, repository()));
    expectReleasedBy(
        "git_branch_iterator_free",
        acquire<git_branch_iterator>(git_branch_iterator_new, repository(), GIT_BRANCH_ALL));
    expectReleasedBy("git_remote_free",
                     acquire<git_remote>(git_remote_create_detached, "/nowhere"));
    expectReleasedBy("git_signature_free",
                     acquire<git_signature>(git_signature_new, "Name", "name@example.org", 0, 0));
}

template <class... Handles> void releaseNulls()
{
    (GitDeleters()(static_cast<Handles *>(nullptr)), ...);
}

TEST(GitDeleters, PassNoNullOn)
{
    const test::LibGit2Recorder recorder;
    releaseNulls<git_annotated_commit, git_branch_iterator, git_commit, git_config, git_index,
                 git_index_conflict_iterator, git_object, git_odb, git_odb_object, git_reference,
                 git_remote, git_repository, git_signature, git_tree>();
    EXPECT_THAT(recorder.calls(), IsEmpty());
}

} // namespace
} // namespace vclink::git
