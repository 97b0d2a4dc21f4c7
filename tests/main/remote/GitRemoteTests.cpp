// SPDX-License-Identifier: MIT
#include "vclink/git/GitRemote.hpp"

#include <algorithm>
#include <iterator>
#include <memory>
#include <optional>
#include <sstream>
#include <string>
#include <type_traits>
#include <typeinfo>
#include <vector>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "RemoteFixture.hpp"
#include "error/logging/severity.hpp"
#include "main/OtherAdapter.hpp"
#include "support/LogCapture.hpp"

namespace
{

namespace git = vclink::git;
using testing::ElementsAre;
using testing::IsEmpty;
using namespace vclink::test;

static_assert(std::is_abstract_v<git::GitRemote> && std::has_virtual_destructor_v<git::GitRemote>);
static_assert(std::is_same_v<decltype(git::GitRemoteHead::local), std::int32_t>);
static_assert(sizeof(git::GitRemoteHead::oid) == 20 && sizeof(git::GitRemoteHead::loid) == 20);

using GitRemoteTest = RemoteFixture;

std::string hexadecimal(const git::GitRemoteHead::Id &id)
{
    git_oid raw = {};
    std::copy(id.begin(), id.end(), std::begin(raw.id));
    return git_oid_tostr_s(&raw);
}

/// A head as `git ls-remote` reports it.
std::string describe(const git::GitRemoteHead &head)
{
    return hexadecimal(head.oid) + '\t' + head.name;
}

class RemoteHeads : public RemoteFixture, public testing::WithParamInterface<Naming>
{
  protected:
    RemoteHeads() : RemoteFixture(GetParam())
    {
    }

    std::vector<std::string> heads() const
    {
        const auto found = remote().getRemoteHeads();
        std::vector<std::string> texts;
        std::transform(found.begin(), found.end(), std::back_inserter(texts), describe);
        return texts;
    }
    std::vector<std::string> headsOfGit() const
    {
        return split(repository_.git({"ls-remote", "origin"}));
    }
    /// The symbolic target of each head that has one, behind its name.
    std::vector<std::string> symbolicHeads() const
    {
        std::vector<std::string> texts;
        for (const auto &head : remote().getRemoteHeads())
            if (!head.symrefTarget.empty())
                texts.push_back(head.name + ' ' + head.symrefTarget);
        return texts;
    }
};

TEST_F(GitRemoteTest, SharesTheFactoryOfItsAdapterAndTakesNoneOfAnotherBackEnd)
{
    const auto factory = adapter_->getOptionsFactory();
    const long before = factory.use_count();
    auto remote = git::GitRemote::create("origin", *adapter_);
    EXPECT_EQ(factory.use_count(), before + 1);
    remote.reset();
    EXPECT_EQ(factory.use_count(), before);
    OtherAdapter other;
    EXPECT_THROW(static_cast<void>(git::GitRemote::create("origin", other)), std::bad_cast);
}

TEST_F(GitRemoteTest, IsMadeWithoutALookAtTheRepository)
{
    const auto adapter = makeAdapter(folder() / "missing");
    const auto remote = git::GitRemote::create("", *adapter);
    EXPECT_EQ(failureOf([&] { remote->fetch({}); }).code, GIT_ENOTFOUND);
    EXPECT_EQ(failureOf([&] { remote->push({}); }).code, GIT_ENOTFOUND);
    EXPECT_EQ(failureOf([&] { remote->getRemoteHeads(); }).code, GIT_ENOTFOUND);
}

TEST_F(GitRemoteTest, ThatTheRepositoryDoesNotKnowFailsAtItsFirstOperation)
{
    const auto unknown = git::GitRemote::create("nobody", *adapter_);
    const Failure failure{GIT_ENOTFOUND, GIT_ERROR_CONFIG, "remote 'nobody' does not exist"};
    const NothingChanges nothing(repository_);
    EXPECT_EQ(failureOf([&] { unknown->fetch({}); }), failure);
    EXPECT_EQ(failureOf([&] { unknown->push({}); }), failure);
    EXPECT_EQ(failureOf([&] { unknown->getRemoteHeads(); }), failure);
}

TEST_F(GitRemoteTest, OfAnImpossibleNameFails)
{
    for (const std::string name : {"", "a b", "..", "-~"})
    {
        const auto impossible = git::GitRemote::create(name, *adapter_);
        EXPECT_EQ(failureOf([&] { impossible->getRemoteHeads(); }).code, GIT_EINVALIDSPEC) << name;
    }
}

TEST_F(GitRemoteTest, KeepsACopyOfItsName)
{
    auto name = std::make_unique<std::string>("origin, and more than fits in place");
    repository_.git({"remote", "add", "gr\xC3\xBC\xC3\x9F", nameOf(server_)});
    *name = "gr\xC3\xBC\xC3\x9F";
    const auto remote = git::GitRemote::create(*name, *adapter_);
    *name = "nobody";
    name.reset();
    EXPECT_EQ(remote->getRemoteHeads().size(), 2U);
}

TEST_F(GitRemoteTest, IsLookedUpAnewAtEachOperation)
{
    const auto later = git::GitRemote::create("later", *adapter_);
    EXPECT_EQ(failureOf([&] { later->getRemoteHeads(); }).code, GIT_ENOTFOUND);
    repository_.git({"remote", "add", "later", nameOf(server_)});
    EXPECT_EQ(later->getRemoteHeads().size(), 2U);
    repository_.git({"remote", "set-url", "later", (folder() / "nowhere").string()});
    EXPECT_NE(failureOf([&] { later->getRemoteHeads(); }).code, 0);
}

TEST_F(GitRemoteTest, ThatCannotBeReachedFailsChangesNothingAndWorksLater)
{
    repository_.git({"remote", "set-url", "origin", (folder() / "nowhere").string()});
    std::optional<NothingChanges> nothing(std::in_place, repository_);
    for (const auto &failure : {failureOf([&] { fetch(); }), failureOf([&] { push({"main"}); }),
                                failureOf([&] { remote().getRemoteHeads(); })})
    {
        EXPECT_LT(failure.code, 0);
        EXPECT_NE(failure.text, "");
    }
    nothing.reset();
    repository_.git({"remote", "set-url", "origin", nameOf(server_)});
    EXPECT_NO_THROW(fetch());
}

TEST_P(RemoteHeads, AreThoseOfGitAndTellNothingOfTheObjectsHere)
{
    publish("folder/second", "x");
    author_.git({"tag", "light"});
    author_.command({"-c", "user.name=A", "-c", "user.email=a@b", "tag", "-m", "words", "heavy"})
        .run();
    author_.git({"branch", "feature/gr\xC3\xBC\xC3\x9F"});
    author_.git({"push", "--quiet", "server", "--all"});
    author_.git({"push", "--quiet", "server", "--tags"});
    fetch();
    const NothingChanges nothing(repository_);
    EXPECT_EQ(heads(), headsOfGit());
    EXPECT_EQ(heads().size(), 6U);
    for (const auto &head : remote().getRemoteHeads())
    {
        EXPECT_EQ(head.local, 0) << head.name;
        EXPECT_EQ(head.loid, git::GitRemoteHead::Id()) << head.name;
    }
}

TEST_P(RemoteHeads, OfAnEmptyRemoteAreNone)
{
    server_.git({"update-ref", "-d", "refs/heads/main"});
    EXPECT_THAT(heads(), IsEmpty());
    EXPECT_EQ(remote().getRemoteHeads().capacity(), 0U);
}

TEST_P(RemoteHeads, NameTheBranchThatTheHeadStandsForUnlessItIsDetached)
{
    EXPECT_THAT(symbolicHeads(), ElementsAre("HEAD refs/heads/main"));
    server_.git({"update-ref", "--no-deref", "HEAD", idOf("HEAD", author_)});
    server_.write("HEAD", idOf("HEAD", author_) + '\n');
    EXPECT_THAT(symbolicHeads(), IsEmpty());
    EXPECT_EQ(heads(), headsOfGit());
}

/// Also of a success: the code 0 with an empty text.
TEST_P(RemoteHeads, LeaveOneRecordOfAFailureThatIsNone)
{
    const LogCapture log(git::SeverityDiagnostic);
    heads();
    EXPECT_THAT(log.messages(), ElementsAre("Throwing error  (0)"));
    heads();
    EXPECT_EQ(log.messages().size(), 2U);
}

TEST_P(RemoteHeads, AreManyInOrder)
{
    const std::string head = idOf("HEAD", author_);
    std::ostringstream commands;
    for (int number = 0; number < 5000; ++number)
        commands << "create refs/heads/many/" << number << ' ' << head << '\n';
    ASSERT_TRUE(server_.command({"update-ref", "--stdin"}).input(commands.str()).run().succeeded());
    server_.git({"pack-refs", "--all"});
    const auto found = heads();
    EXPECT_EQ(found.size(), 5002U);
    EXPECT_EQ(found, headsOfGit());
}

INSTANTIATE_TEST_SUITE_P(Locally, RemoteHeads, testing::Values(Naming::PlainPath, Naming::FileUrl));

} // namespace
