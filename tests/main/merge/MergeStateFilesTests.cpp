// SPDX-License-Identifier: MIT
// The files in git's folder that the library writes beside libgit2's own for a merge.
#include <cerrno>
#include <functional>
#include <string>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "InterruptedMergeFixture.hpp"
#include "main/mergeState/MergeMarker.hpp"
#include "main/mergeState/mergeHead.hpp"
#include "support/DescriptorLimit.hpp"
#include "support/FileSizeLimit.hpp"
#include "support/text.hpp"
#include "util/repository/repository.hpp"

namespace
{

namespace git = vclink::git;
using testing::AllOf;
using testing::HasSubstr;
using namespace vclink::test;

class MergeStateFiles : public InterruptedMerge
{
  protected:
    MergeStateFiles()
    {
        makeDiverged();
    }

    git_oid oidOf(const std::string &name) const
    {
        git_oid id{};
        EXPECT_EQ(git_oid_fromstr(&id, idOf(name).c_str()), 0);
        return id;
    }
    /// Lets git merge as far as the commit.
    void beginMergeAsGit() const
    {
        repository_.git({"merge", "--quiet", "--no-commit", "topic"});
    }
    /// @return the failure's text
    std::string restoreUnder(const std::function<void(const std::function<void()> &)> &limit) const
    {
        Failure failure;
        limit([&] { failure = failureOf([&] { git::restoreMergeHead(opened_.get(), theirs_); }); });
        EXPECT_EQ(failure.errorClass, GIT_ERROR_OS);
        return failure.text;
    }

    const git::OwnedHandle<git_repository> opened_ =
        git::openRepository(asPath(repository_.path()));
    const std::string head_ = repository_ / ".git/MERGE_HEAD";
    git_oid theirs_{};
};

/// open(2) reports EMFILE before it looks at the name.
TEST_F(MergeStateFiles, KeepTheirParentIfNoFileCanBeOpened)
{
    theirs_ = oidOf("topic");
    beginMergeAsGit();
    // A sanitizer needs a descriptor to examine the first exception.
    static_cast<void>(failureOf([this] { branches().deleteBranch("missing"); }));
    const std::string text = restoreUnder(
        [](const auto &restore)
        {
            const DescriptorLimit none(0);
            restore();
        });
    EXPECT_THAT(text, AllOf(HasSubstr("could not write '"), HasSubstr("Too many open files")));
    ASSERT_TRUE(exists(".git/MERGE_HEAD"));
    EXPECT_EQ(repository_.line({"rev-parse", "MERGE_HEAD"}), idOf("topic"));
    expectConcluded();
}

TEST_F(MergeStateFiles, HaveTheirParentOnlyOnce)
{
    theirs_ = oidOf("topic");
    beginMergeAsGit();
    const std::string before = repository_.read(".git/MERGE_HEAD");
    git::restoreMergeHead(opened_.get(), theirs_);
    EXPECT_EQ(repository_.read(".git/MERGE_HEAD"), before);
    repository_.remove(".git/MERGE_HEAD");
    git::restoreMergeHead(opened_.get(), theirs_);
    EXPECT_EQ(repository_.read(".git/MERGE_HEAD"), before);
}

/// The first write(2) writes a part and sets no errno, the second one fails.
TEST_F(MergeStateFiles, AreNotLeftInPart)
{
    theirs_ = oidOf("topic");
    const std::string text = restoreUnder(
        [](const auto &restore)
        {
            const FileSizeLimit part(20);
            errno = 0;
            restore();
        });
    EXPECT_THAT(text, AllOf(HasSubstr("could not write '"), HasSubstr("File too large")));
    EXPECT_FALSE(exists(".git/MERGE_HEAD"));
}

/// A merge does not begin without the marker.
TEST_F(MergeStateFiles, HaveAMarkerOrAFailure)
{
    repository_.write(mergeMarker, markerOf("main", "topic"));
    repository_.write(".git/AUTO_MERGE", idOf("main^{tree}") + "\n");
    const git::MergeSides sides{oidOf("main"), oidOf("topic")};
    const Failure failure = failureOf(
        [&]
        {
            const FileSizeLimit part(60);
            errno = 0;
            const git::MergeMarker marker(opened_.get(), sides);
        });
    EXPECT_THAT(failure.text, AllOf(HasSubstr("vclink-merge"), HasSubstr("File too large")));
    EXPECT_FALSE(exists(mergeMarker));
    EXPECT_EQ(repository_.read(".git/AUTO_MERGE"), idOf("main^{tree}") + "\n");
}

} // namespace
