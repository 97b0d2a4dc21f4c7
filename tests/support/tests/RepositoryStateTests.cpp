// SPDX-License-Identifier: MIT
#include <string>

#include <gtest/gtest.h>

#include "support/GitFixture.hpp"
#include "support/RepositoryState.hpp"

namespace
{

using vclink::test::GitRepository;
using vclink::test::stateOf;

using StateOfRepository = vclink::test::GitFixture;

void expectHeadOfGit(const GitRepository &repository)
{
    EXPECT_EQ(stateOf(repository).head,
              repository.tryGit({"symbolic-ref", "--quiet", "HEAD"}).output +
                  repository.tryGit({"rev-parse", "--quiet", "--verify", "HEAD"}).output);
}

TEST_F(StateOfRepository, HasTheHeadThatGitReports)
{
    auto repository = makeRepository();
    expectHeadOfGit(repository);
    repository.commit("first");
    expectHeadOfGit(repository);
    repository.git({"branch", "main-line"});
    repository.git({"pack-refs", "--all"});
    expectHeadOfGit(repository);
    repository.git({"checkout", "--quiet", "--detach"});
    expectHeadOfGit(repository);
    repository.git(
        {"-c", "core.preferSymlinkRefs=true", "symbolic-ref", "HEAD", "refs/heads/main"});
    expectHeadOfGit(repository);
    repository.git({"worktree", "add", "--quiet", folder() / "linked", "main-line"});
    expectHeadOfGit(GitRepository(folder() / "linked"));
    repository.git({"clone", "--quiet", "--bare", ".", folder() / "bare"});
    expectHeadOfGit(GitRepository(folder() / "bare"));
}

} // namespace
