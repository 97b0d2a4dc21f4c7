// SPDX-License-Identifier: MIT
#include <filesystem>
#include <string>

#include <git2.h>
#include <gtest/gtest.h>

#include "support/Descriptors.hpp"
#include "support/Failure.hpp"
#include "support/GitFixture.hpp"
#include "support/LibGit2Session.hpp"
#include "support/text.hpp"
#include "util/repository/repository.hpp"
#include "vclink/git/LibGit2Exception.hpp"

namespace
{

using vclink::git::isRepository;
using vclink::git::LibGit2Exception;
using vclink::test::asPath;

class IsRepository : public vclink::test::GitFixture
{
  protected:
    vclink::test::LibGit2Session session_{environment()};
};

TEST_F(IsRepository, IsTrueForTheRootOfAWorkingCopy)
{
    EXPECT_TRUE(isRepository(asPath(makeRepository().path())));
}

TEST_F(IsRepository, IsFalseForAFolderThatIsNone)
{
    EXPECT_FALSE(isRepository(asPath(folder().path())));
    EXPECT_FALSE(isRepository(asPath(folder() / "missing")));
}

TEST_F(IsRepository, MakesNoSearchUpwards)
{
    const auto repository = makeRepository();
    repository.makeFolder("sub/dir");
    EXPECT_FALSE(isRepository(asPath(repository / "sub")));
    EXPECT_FALSE(isRepository(asPath(repository / "sub/dir")));
}

TEST_F(IsRepository, RaisesWhatElseLibGit2Says)
{
    const auto repository = makeRepository();
    repository.write("broken/.git", "neither a folder nor a link");
    const auto failure =
        vclink::test::failureOf([&] { isRepository(asPath(repository / "broken")); });
    EXPECT_EQ(failure.code, GIT_ERROR);
    EXPECT_EQ(failure.errorClass, GIT_ERROR_REPOSITORY);
    EXPECT_NE(failure.text, "");
}

/// Nothing but the folder's layout is looked at; the first operation meets the rest.
TEST_F(IsRepository, IsTrueForARepositoryThatCannotBeOpened)
{
    const auto repository = makeRepository();
    repository.write(".git/config", "[core\n");
    EXPECT_TRUE(isRepository(asPath(repository.path())));
    EXPECT_THROW(static_cast<void>(vclink::git::openRepository(asPath(repository.path()))),
                 LibGit2Exception);
}

TEST_F(IsRepository, LeavesNoDescriptorOpen)
{
    const auto repository = makeRepository();
    repository.write("broken/.git", "neither a folder nor a link");
    isRepository(asPath(repository.path()));
    const vclink::test::NoDescriptorLeak noLeak;
    for (int i = 0; i < 20; ++i)
    {
        EXPECT_TRUE(isRepository(asPath(repository.path())));
        EXPECT_FALSE(isRepository(asPath(folder() / "missing")));
        EXPECT_THROW(isRepository(asPath(repository / "broken")), LibGit2Exception);
    }
}

TEST_F(IsRepository, ReadsThePathAsUtf8)
{
    const auto repository = makeRepository("gr\xC3\xBC\xC3\x9F \xF0\x9F\x8C\xB3 \xFF");
    EXPECT_TRUE(isRepository(asPath(repository.path())));
}

} // namespace
