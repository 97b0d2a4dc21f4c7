// SPDX-License-Identifier: MIT
#include <memory>
#include <string>
#include <utility>
#include <vector>

#include <git2.h>
#include <git2/sys/odb_backend.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "error/HermeticLibGit2.hpp"
#include "error/errorUtil/GitResult.hpp"
#include "error/errorUtil/libgit2Errors.hpp"
#include "support/Failure.hpp"

namespace vclink::git
{
namespace
{

using test::failureOf;
using test::HermeticLibGit2;
using testing::ElementsAre;
using testing::IsEmpty;

std::vector<std::string> releasedStores;

/// An object store whose release is noted and leaves a record of its own.
struct Store : git_odb_backend
{
    explicit Store(std::string storeName) : git_odb_backend(), name(std::move(storeName))
    {
        git_odb_init_backend(this, GIT_ODB_BACKEND_VERSION);
        free = [](git_odb_backend *backend)
        {
            const std::unique_ptr<Store> store(static_cast<Store *>(backend));
            releasedStores.push_back(store->name);
            git_error_set_str(GIT_ERROR_ODB, "text of the release");
        };
    }

    std::string name;
};

/// Stands for a libgit2 function: leaves a handle, and with a code that is not 0 a record.
int openStore(git_odb **out, int code, const char *text)
{
    EXPECT_EQ(*out, nullptr) << "the output was not zeroed";
    git_odb_new(out);
    git_odb_add_backend(*out, std::make_unique<Store>(text).release(), 1);
    if (code != 0)
    {
        git_error_set_str(GIT_ERROR_FILESYSTEM, text);
    }
    return code;
}

int failWithoutAHandle(git_odb ** /*out*/)
{
    git_error_set_str(GIT_ERROR_OS, "nothing to open");
    return GIT_ENOTFOUND;
}

class Acquire : public testing::Test
{
  protected:
    Acquire()
    {
        releasedStores.clear();
    }
    HermeticLibGit2 libgit2;
};

TEST_F(Acquire, GivesAHandleThatTheCallerOwns)
{
    GitResult<OwnedHandle<git_odb>> result = acquire<git_odb>(openStore, 0, "one");
    ASSERT_TRUE(result.has_value());
    {
        const OwnedHandle<git_odb> store = std::move(result).value();
        EXPECT_EQ(git_odb_num_backends(store.get()), 1u);
        EXPECT_THAT(releasedStores, IsEmpty());
    }
    EXPECT_THAT(releasedStores, ElementsAre("one"));
}

TEST_F(Acquire, ReleasesAHandleThatNobodyAsksFor)
{
    EXPECT_TRUE(acquire<git_odb>(openStore, 0, "one").has_value());
    EXPECT_THAT(releasedStores, ElementsAre("one"));
}

TEST_F(Acquire, ReadsTheErrorBeforeItReleasesAHandleThatWasLeft)
{
    const GitResult<OwnedHandle<git_odb>> result =
        acquire<git_odb>(openStore, -12, "text of the failure");
    EXPECT_THAT(releasedStores, ElementsAre("text of the failure"));
    EXPECT_STREQ(git_error_last()->message, "text of the release");
    ASSERT_TRUE(result.has_error());
    EXPECT_EQ(result.error().getCode(), -12);
    EXPECT_EQ(result.error().getErrorClass(), GIT_ERROR_FILESYSTEM);
    EXPECT_EQ(result.error().getMessage(), u"text of the failure");
}

TEST_F(Acquire, TakesAPositiveCodeForAFailure)
{
    const GitResult<OwnedHandle<git_odb>> result = acquire<git_odb>(openStore, 1, "text");
    ASSERT_TRUE(result.has_error());
    EXPECT_EQ(result.error().getCode(), 1);
    EXPECT_THAT(releasedStores, ElementsAre("text"));
}

TEST_F(Acquire, HoldsTheErrorOfAFailureWithoutAHandle)
{
    const GitResult<OwnedHandle<git_odb>> result = acquire<git_odb>(failWithoutAHandle);
    ASSERT_TRUE(result.has_error());
    EXPECT_EQ(result.error().getCode(), GIT_ENOTFOUND);
    EXPECT_EQ(result.error().getMessage(), u"nothing to open");
    EXPECT_THAT(releasedStores, IsEmpty());
}

/// As libgit2 does in places.
int failWithoutAText(git_odb ** /*out*/)
{
    return GIT_ERROR;
}

TEST_F(Acquire, HasNoTextOfAnEarlierCall)
{
    git_error_set_str(GIT_ERROR_CONFIG, "text of an earlier call");
    const GitResult<OwnedHandle<git_odb>> result = acquire<git_odb>(failWithoutAText);
    ASSERT_TRUE(result.has_error());
    EXPECT_EQ(result.error().getCode(), GIT_ERROR);
    EXPECT_EQ(result.error().getErrorClass(), 0);
    EXPECT_EQ(result.error().getMessage(), ustring());
}

TEST_F(Acquire, ReleasesHandlesInReverseOrderWhenAnExceptionPasses)
{
    const std::string path = libgit2.folder().path();
    const auto openThree = [&]
    {
        const OwnedHandle<git_odb> one = acquire<git_odb>(openStore, 0, "one").value();
        const OwnedHandle<git_odb> two = acquire<git_odb>(openStore, 0, "two").value();
        acquire<git_repository>(git_repository_open, path.c_str()).value();
    };
    EXPECT_EQ(failureOf(openThree).code, GIT_ENOTFOUND);
    EXPECT_THAT(releasedStores, ElementsAre("two", "one"));
}

} // namespace
} // namespace vclink::git
