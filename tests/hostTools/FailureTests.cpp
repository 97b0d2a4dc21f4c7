// SPDX-License-Identifier: MIT
#include "hostTools.hpp"

#include <exception>
#include <functional>
#include <memory>
#include <stdexcept>
#include <string>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "support/GitFixture.hpp"
#include "support/LocaleOfTheProcess.hpp"
#include "support/TestInteractor.hpp"
#include "support/UnprivilegedUser.hpp"
#include "vclink/git/BranchManager.hpp"
#include "vclink/git/GitAdapterFactory.hpp"

namespace
{

using namespace vclink::test;
using host_tools::Failure;
using host_tools::FailureKind;
using testing::HasSubstr;

class HostFailures : public GitFixture
{
  protected:
    HostFailures()
    {
        repository_.git({"config", "user.name", "Ada"});
        repository_.git({"config", "user.email", "ada@example.org"});
        repository_.write("a", "first\n");
        repository_.commitAll("first");
    }
    upath pathOf(const std::string &name) const
    {
        return host_tools::toUpath(repository_ / name);
    }
    Failure fail(const std::function<void()> &operation) const
    {
        try
        {
            operation();
        }
        catch (...)
        {
            return host_tools::describe(std::current_exception());
        }
        ADD_FAILURE() << "nothing was thrown";
        return {};
    }

    const LocaleOfTheProcess locale_{"en"};
    GitRepository repository_ = makeRepository();
    std::shared_ptr<TestInteractor> interactor_ = std::make_shared<TestInteractor>();
    std::unique_ptr<vclink::CMAdapter> adapter_ =
        vclink::git::GitAdapterFactory().createAdapterFor(pathOf(""), interactor_);
};

TEST_F(HostFailures, NameTheFilesThatAreKnownAlready)
{
    const Failure failure = fail([this] { adapter_->addFiles({pathOf("a")}); });
    EXPECT_EQ(failure.kind, FailureKind::AlreadyAdded);
    EXPECT_EQ(failure.id, "shared_vclink:git:AlreadyAdded");
    EXPECT_THAT(fl::i18n::ustring_to_utf8(failure.files), HasSubstr((repository_ / "a").string()));
    EXPECT_THAT(fl::i18n::ustring_to_utf8(failure.text), HasSubstr((repository_ / "a").string()));
    EXPECT_EQ(failure.code, 0);
}

TEST_F(HostFailures, HaveLibGit2sCode)
{
    const auto manager = vclink::git::BranchManager::create(*adapter_);
    const Failure failure = fail([&manager] { manager->switchBranch("nowhere"); });
    EXPECT_EQ(failure.kind, FailureKind::LibGit2Error);
    EXPECT_EQ(failure.code, -3);
    EXPECT_FALSE(failure.isLocked());
}

TEST_F(HostFailures, TellThatAnotherProgramHoldsALock)
{
    repository_.write("b", "new\n");
    repository_.write(".git/index.lock", "");
    EXPECT_TRUE(fail([this] { adapter_->addFiles({pathOf("b")}); }).isLocked());
}

TEST_F(HostFailures, TellAMissingPermissionFromALock)
{
    repository_.setMode(".git/HEAD", 0);
    giveToUnprivilegedUser(repository_.path());
    const std::string answer = runAsUnprivilegedUser(
        [this]
        {
            const auto manager = vclink::git::BranchManager::create(*adapter_);
            const Failure failure = fail([&manager] { (void)manager->getHeadRevision(); });
            return std::to_string(failure.code) + (failure.isDenied ? " denied" : "") +
                   (failure.isLocked() ? " locked" : "");
        });
    EXPECT_EQ(answer, "-14 denied");
}

TEST_F(HostFailures, OfRemovingAndMergingAreToldApart)
{
    EXPECT_EQ(fail([this] { adapter_->removeFiles({pathOf("nothing")}); }).kind,
              FailureKind::NoFilesToRemove);
    const auto manager = vclink::git::BranchManager::create(*adapter_);
    EXPECT_EQ(fail([&manager] { manager->merge("nowhere"); }).kind, FailureKind::MergeFailed);
}

TEST_F(HostFailures, NameTheFilesInConflict)
{
    repository_.git({"checkout", "--quiet", "-b", "topic"});
    repository_.write("a", "theirs\n");
    repository_.commitAll("theirs");
    repository_.git({"checkout", "--quiet", "main"});
    repository_.write("a", "ours\n");
    repository_.commitAll("ours");
    repository_.tryGit({"merge", "topic"});
    const Failure failure = fail([this] { adapter_->revertFiles({pathOf("a")}); });
    EXPECT_EQ(failure.kind, FailureKind::Conflicted);
    EXPECT_THAT(fl::i18n::ustring_to_utf8(failure.files), HasSubstr((repository_ / "a").string()));
}

TEST_F(HostFailures, TellACancellation)
{
    repository_.write("a", "second\n");
    interactor_->cancel();
    const Failure failure = fail([this] { adapter_->revertFiles({pathOf("a")}); });
    EXPECT_EQ(failure.kind, FailureKind::Cancelled);
    EXPECT_EQ(failure.text, u"The operation was cancelled.");
    EXPECT_EQ(repository_.read("a"), "second\n");
}

TEST_F(HostFailures, SpeakTheLanguageOfTheMoment)
{
    std::exception_ptr exception;
    try
    {
        adapter_->addFiles({pathOf("a")});
    }
    catch (...)
    {
        exception = std::current_exception();
    }
    const ustring english = host_tools::describe(exception).text;
    const LocaleOfTheProcess german("de");
    EXPECT_NE(host_tools::describe(exception).text, english);
}

TEST_F(HostFailures, OfOtherKindsHaveTheirOwnWords)
{
    const Failure failure = fail([] { throw std::runtime_error("full"); });
    EXPECT_EQ(failure.kind, FailureKind::Other);
    EXPECT_EQ(failure.id, "");
    EXPECT_EQ(failure.text, u"full");
    EXPECT_EQ(fail([] { throw 1; }).kind, FailureKind::Other);
}

} // namespace
