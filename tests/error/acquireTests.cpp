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
#include "error/makeError.hpp"
#include "support/Failure.hpp"

namespace vclink::git
{
namespace
{

using test::failureOf;
using test::HermeticLibGit2;
using test::isError;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::SizeIs;

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
        git_error_set_str(GIT_ERROR_FILESYSTEM, text);
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

TEST_F(Acquire, GivesAHandleThatTheCallerOwnsAndReleasesOneThatNobodyAsksFor)
{
    EXPECT_TRUE(acquire<git_odb>(openStore, 0, "dropped").has_value());
    EXPECT_THAT(releasedStores, ElementsAre("dropped"));
    GitResult<OwnedHandle<git_odb>> result = acquire<git_odb>(openStore, 0, "one");
    ASSERT_TRUE(result.has_value());
    {
        const OwnedHandle<git_odb> store = std::move(result).value();
        EXPECT_EQ(git_odb_num_backends(store.get()), 1u);
        EXPECT_THAT(releasedStores, SizeIs(1));
    }
    EXPECT_THAT(releasedStores, ElementsAre("dropped", "one"));
}

TEST_F(Acquire, ReadsTheErrorBeforeItReleasesAHandleThatWasLeft)
{
    for (const int code : {-12, 1})
    {
        const auto result = acquire<git_odb>(openStore, code, "text of the failure");
        EXPECT_STREQ(git_error_last()->message, "text of the release");
        ASSERT_TRUE(result.has_error());
        EXPECT_THAT(result.error(), isError(code, GIT_ERROR_FILESYSTEM, u"text of the failure"));
    }
    EXPECT_THAT(releasedStores, ElementsAre("text of the failure", "text of the failure"));
}

/// As libgit2 does in places.
int failWithoutAText(git_odb ** /*out*/)
{
    return GIT_ERROR;
}

TEST_F(Acquire, HoldsTheErrorOfAFailureWithoutAHandleAndNoTextOfAnEarlierCall)
{
    const auto told = acquire<git_odb>(failWithoutAHandle);
    ASSERT_TRUE(told.has_error());
    EXPECT_THAT(told.error(), isError(GIT_ENOTFOUND, GIT_ERROR_OS, u"nothing to open"));
    const auto silent = acquire<git_odb>(failWithoutAText);
    ASSERT_TRUE(silent.has_error());
    EXPECT_THAT(silent.error(), isError(GIT_ERROR, 0, u""));
    EXPECT_THAT(releasedStores, IsEmpty());
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
