// SPDX-License-Identifier: MIT
#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <string>

#include <boost/system/system_error.hpp>
#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "CommitFixture.hpp"
#include "HostName.hpp"
#include "main/files/commitIdentity.hpp"
#include "util/repository/repository.hpp"
#include "vclink/git/LibGit2Exception.hpp"

namespace
{

using testing::ElementsAre;
using testing::IsEmpty;
using testing::StartsWith;
using vclink::git::makeFallbackSignature;
using namespace vclink::test;

using NoUserNameException = vclink::git::TagException<shared_vclink::git::NoUserName>;

std::string textOf(const git_signature &signature)
{
    return std::string(signature.name) + " <" + signature.email + ">";
}

/// For a machine whose name cannot be found out for this reason; 0 for no reason.
int fail(int error)
{
    if (error != 0)
        errno = error;
    return -1;
}

class FallbackSignature : public CommitFixture
{
  protected:
    FallbackSignature()
    {
        repository_.git({"config", "--remove-section", "user"});
        ::setenv("USER", "builder", 1);
        ::setenv("LOGNAME", "logger", 1);
    }
};

TEST_F(FallbackSignature, IsTheUserAtTheHostAndTheCommitsAuthorAndCommitter)
{
    const std::string expected = "builder <builder@node7>";
    const HostName host("node7");
    EXPECT_EQ(textOf(*makeFallbackSignature()), expected);
    EXPECT_THAT(host.variables, ElementsAre("USER"));
    EXPECT_THAT(host.sizes, ElementsAre(1024U));
    commit();
    EXPECT_EQ(repository_.line({"log", "-1", "--format=%an <%ae>, %cn <%ce>"}),
              expected + ", " + expected);
    const auto repository = vclink::git::openRepository(asPath(repository_.path().string()));
    EXPECT_EQ(textOf(*vclink::git::makeSignature(repository.get())), expected);
}

TEST_F(FallbackSignature, DoesNotAskForTheLogNameWhereTheUserIsEmpty)
{
    ::setenv("USER", "", 1);
    const HostName host("node7");
    EXPECT_THROW(static_cast<void>(makeFallbackSignature()), vclink::git::LibGit2Exception);
    EXPECT_THAT(host.variables, ElementsAre("USER"));
}

TEST_F(FallbackSignature, AsksForTheLogNameAfterTheUser)
{
    ::unsetenv("USER");
    const HostName host("node7");
    EXPECT_EQ(textOf(*makeFallbackSignature()), "logger <logger@node7>");
    EXPECT_THAT(host.variables, ElementsAre("USER", "LOGNAME"));
}

TEST_F(FallbackSignature, DoesNotAskForTheHostWhereThereIsNoName)
{
    ::unsetenv("USER");
    ::unsetenv("LOGNAME");
    const HostName host("node7");
    EXPECT_THROW(static_cast<void>(makeFallbackSignature()), NoUserNameException);
    EXPECT_THAT(host.sizes, IsEmpty());
    EXPECT_THAT(host.variables, ElementsAre("USER", "LOGNAME"));
}

TEST_F(FallbackSignature, IsNotAskedForWhereTheIdentityIsConfigured)
{
    repository_.git({"config", "user.name", "Ann"});
    repository_.git({"config", "user.email", "ann@example.com"});
    const HostName host("node7");
    commit();
    EXPECT_THAT(host.variables, IsEmpty());
    EXPECT_THAT(host.sizes, IsEmpty());
}

TEST_F(FallbackSignature, TakesTheHostWholeAndDoesNotCompleteIt)
{
    for (const std::string &name :
         {std::string("node7.example.com"), std::string(1023, 'h'), std::string()})
    {
        const HostName host(name);
        EXPECT_EQ(textOf(*makeFallbackSignature()), "builder <builder@" + name + '>');
    }
}

TEST_F(FallbackSignature, TakesTheHostUpToTheFirstNulAndNoErrorOfASuccessForAFailure)
{
    const HostName host(
        [](char *buffer, std::size_t size)
        {
            std::memset(buffer, 'x', size);
            std::strcpy(buffer, "node7");
            errno = EIO;
            return 0;
        });
    EXPECT_EQ(textOf(*makeFallbackSignature()), "builder <builder@node7>");
}

TEST_F(FallbackSignature, DoesNotMistakeAnEarlierErrorForTheHostsOne)
{
    const HostName host([](char *, std::size_t) { return fail(0); });
    errno = EIO;
    EXPECT_EQ(textOf(*makeFallbackSignature()), "builder <builder@>") << "and none of its own";
    EXPECT_THAT(host.errors, ElementsAre(0));
}

TEST_F(FallbackSignature, RaisesTheReasonForWhichTheHostsNameFails)
{
    for (const int error : {ENAMETOOLONG, EPERM})
    {
        const HostName host([error](char *, std::size_t) { return fail(error); });
        try
        {
            static_cast<void>(makeFallbackSignature());
            ADD_FAILURE() << "no exception";
        }
        catch (const boost::system::system_error &exception)
        {
            EXPECT_EQ(exception.code().value(), error);
            EXPECT_EQ(exception.code().category(), boost::system::system_category());
            // Nothing is before the reason; later releases of Boost append the code.
            EXPECT_THAT(exception.what(), StartsWith(exception.code().message()));
        }
    }
}

TEST_F(FallbackSignature, LeavesTheRepositoryAloneWhereTheHostsNameFails)
{
    repository_.write("file", "changed\n");
    repository_.remove("other");
    const NothingChanges nothing(repository_);
    const HostName host([](char *, std::size_t) { return fail(EPERM); });
    EXPECT_THROW(commit(), boost::system::system_error);
}

TEST_F(FallbackSignature, IsRefusedWithAHostThatNoAddressMayHold)
{
    repository_.write("file", "changed\n");
    const NothingChanges nothing(repository_);
    const HostName host("<node7>");
    EXPECT_EQ(failureOf([this] { commit(); }).errorClass, GIT_ERROR_INVALID);
}

} // namespace
