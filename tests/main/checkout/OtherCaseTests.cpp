// SPDX-License-Identifier: MIT
#include "main/files/otherCase.hpp"
#include "support/text.hpp"

#include <functional>
#include <string>

#include <git2/errors.h>
#include <gtest/gtest.h>

#include "ObstacleFixture.hpp"

namespace
{

using namespace vclink::test;

/// `core.ignorecase`, which git sets on some file systems, in a history that has two names which
/// differ only in case. libgit2 finds one of them by either name.
class OtherCase : public ObstacleFixture
{
  protected:
    OtherCase()
    {
        repository_.commitAll(writes("readme", "of main\n"), "readme");
    }
    void ignoreCase() const
    {
        repository_.git({"config", "core.ignorecase", "true"});
    }
};

TEST_F(OtherCase, AddedByTheirsIsRefusedInAMerge)
{
    diverge(writes("ours", "x"), writes("README", "theirs\n"));
    ignoreCase();
    expectMergeRefused(refusal("the names 'README' and 'readme' differ only in case, and "
                               "'core.ignorecase' is set: merge with 'git merge'"));
}

TEST_F(OtherCase, OfAChangedFileIsRefusedInACommit)
{
    repository_.commitAll(writes("README", "other\n"), "both");
    ignoreCase();
    repository_.write("file", "changed\n");
    EXPECT_NO_THROW(adapter_->commit(upath(), u"another file"));
    for (const std::string name : {"README", "readme"})
    {
        const std::string before = repository_.read(name);
        repository_.write(name, "changed\n");
        expectNothingChanges(
            [this]
            {
                EXPECT_EQ(failureOf([this] { adapter_->commit(upath(), u"one of both"); }),
                          (Failure{GIT_ERROR, GIT_ERROR_INDEX,
                                   "the names 'README' and 'readme' differ only in case, and "
                                   "'core.ignorecase' is set: commit with 'git commit', or rename "
                                   "one of them"}));
            });
        repository_.write(name, before);
    }
}

/// libgit2 would act on both; git acts on one.
TEST_F(OtherCase, OfAListedFileIsRefused)
{
    repository_.commitAll(writes("README", "other\n"), "both");
    diverge(writes("README", "ours\n") + writes("readme", "ours\n"),
            writes("README", "theirs\n") + writes("readme", "theirs\n"));
    const auto expectRefused = [this](const std::function<void()> &operation)
    {
        const NothingChanges nothing(repository_);
        EXPECT_EQ(failureOf(operation),
                  (Failure{GIT_ERROR, GIT_ERROR_INDEX,
                           "the names 'README' and 'readme' differ only in case, and "
                           "'core.ignorecase' is set: use git for them, or set it to false if the "
                           "file system distinguishes case"}));
    };
    ignoreCase();
    repository_.write("README", "changed\n");
    repository_.write("file", "changed\n");
    for (const std::string name : {"README", "readme"})
    {
        expectRefused([&] { adapter_->removeFiles({pathOf(name)}); });
        expectRefused([&] { adapter_->revertFiles({pathOf(name)}); });
        expectRefused([&] { adapter_->markResolved(pathOf(name)); });
    }
    repository_.git({"-c", "core.ignorecase=false", "restore", "README"});
    adapter_->markResolved(pathOf("file"));
    adapter_->revertFiles({pathOf("file")});
    EXPECT_FALSE(repository_.tryGit({"-c", "core.ignorecase=false", "merge", "topic"}).succeeded());
    expectRefused([&] { adapter_->markResolved(pathOf("readme")); });
    repository_.remove("readme");
    expectRefused([&] { adapter_->markResolved(pathOf("readme")); });
}

} // namespace
