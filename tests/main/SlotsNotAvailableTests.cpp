// SPDX-License-Identifier: MIT
#include <functional>
#include <map>
#include <set>
#include <string>

#include <git2.h>
#include <gtest/gtest.h>

#include "AdapterTest.hpp"
#include "RepositoryState.hpp"
#include "error/notAvailable.hpp"
#include "options/gitRecords.hpp"
#include "support/text.hpp"
#include "vclink/git/GitAdapterFactory.hpp"
#include "vclink/git/LibGit2Exception.hpp"

namespace
{

namespace git = vclink::git;
using vclink::test::asPath;
using vclink::test::asUtf8;

class SlotsNotAvailable : public vclink::test::AdapterTest
{
  protected:
    using Slots = std::map<std::string, std::function<void()>>;

    SlotsNotAvailable()
    {
        // So that each operation has something to do, and a commit an identity.
        repository_.write("file", "x");
        repository_.git({"config", "user.name", "Somebody"});
        repository_.git({"config", "user.email", "somebody@example.com"});
    }

    Slots adapterSlots()
    {
        return {{"GitAdapter::commit", [this] { adapter_->commit(root_, u"message"); }},
                {"GitAdapter::addFiles", [this] { adapter_->addFiles({file_}); }},
                {"GitAdapter::removeFiles", [this] { adapter_->removeFiles({file_}); }},
                {"GitAdapter::revertFiles", [this] { adapter_->revertFiles({file_}); }},
                {"GitAdapter::markResolved", [this] { adapter_->markResolved(file_); }},
                {"GitAdapter::getFileStates", [this] { adapter_->getFileStates({file_}); }},
                {"GitAdapter::getFolderStates", [this] { adapter_->getFolderStates(root_); }},
                {"GitAdapter::getRootFolder", [this] { adapter_->getRootFolder(); }}};
    }

    Slots factorySlots()
    {
        return {{"GitAdapterFactory::createAdapterFor",
                 [this] { factory_.createAdapterFor(root_, interactor_); }},
                {"GitAdapterFactory::createWorkingCopyGenerator",
                 [this] { factory_.createWorkingCopyGenerator(interactor_); }},
                {"GitAdapterFactory::isAdapterFor", [this] { factory_.isAdapterFor(root_); }},
                {"GitAdapterFactory::getName", [this] { factory_.getName(); }}};
    }

    Slots conversionSlots()
    {
        auto &callbacks = adapter_->getCallbacks();
        return {
            {"toGitProxyOptions",
             [&] { git::toGitProxyOptions(git::ProxyOptions(), callbacks.proxyCallbacks()); }},
            {"toGitMergeOptions", [] { git::toGitMergeOptions(git::MergeOptions()); }},
            {"toGitCheckoutOptions", [&]
             { git::toGitCheckoutOptions(git::CheckoutOptions(), callbacks.checkoutCallbacks()); }},
            {"toGitRemoteCallbacks",
             [&] { git::toGitRemoteCallbacks(callbacks.remoteCallbacks()); }},
            {"toGitFetchOptions", [&] { git::toGitFetchOptions(git::FetchOptions(), callbacks); }},
            {"toGitPushOptions", [&] { git::toGitPushOptions(git::PushOptions(), callbacks); }},
            {"toGitCloneOptions", [&] { git::toGitCloneOptions(git::CloneOptions(), callbacks); }}};
    }

    Slots optionsFactorySlots()
    {
        const auto factory = adapter_->getOptionsFactory();
        return {{"GitOptionsFactory::makeCloneOptions", [=] { factory->makeCloneOptions(); }},
                {"GitOptionsFactory::makeFetchOptions", [=] { factory->makeFetchOptions(); }},
                {"GitOptionsFactory::makeProxyOptions", [=] { factory->makeProxyOptions(); }},
                {"GitOptionsFactory::makePushOptions", [=] { factory->makePushOptions(); }},
                {"GitOptionsFactory::makeCheckoutOptions", [=] { factory->makeCheckoutOptions(); }},
                {"GitOptionsFactory::makeStatusOptions", [=] { factory->makeStatusOptions(); }},
                {"GitOptionsFactory::makeMergeOptions", [=] { factory->makeMergeOptions(); }}};
    }

    Slots allSlots()
    {
        Slots slots;
        for (auto &&some :
             {adapterSlots(), factorySlots(), conversionSlots(), optionsFactorySlots()})
            slots.insert(some.begin(), some.end());
        return slots;
    }

    static std::set<std::string> listed()
    {
        return {git::slotsNotAvailable.begin(), git::slotsNotAvailable.end()};
    }

    vclink::test::GitRepository repository_ = makeRepository();
    const upath root_ = asPath(repository_.path());
    const upath file_ = asPath(repository_ / "file");
    const git::GitAdapterFactory factory_;
    const std::unique_ptr<git::GitAdapter> adapter_ = makeAdapter(repository_.path());
};

/// What the slot raises; a success is an empty text.
std::string raisedText(const std::function<void()> &slot)
{
    try
    {
        slot();
    }
    catch (const git::LibGit2Exception &exception)
    {
        return asUtf8(exception.getError().getMessage());
    }
    return {};
}

TEST_F(SlotsNotAvailable, AreThoseOfTheListAndNoOthers)
{
    std::set<std::string> raising;
    for (const auto &[name, slot] : allSlots())
    {
        const std::string text = raisedText(slot);
        EXPECT_TRUE(text.empty() || text == "not available in this build") << name << ": " << text;
        if (!text.empty())
            raising.insert(name);
    }
    EXPECT_EQ(raising, listed());
}

TEST_F(SlotsNotAvailable, AreNamedOnceEach)
{
    EXPECT_EQ(listed().size(), git::slotsNotAvailable.size());
}

TEST_F(SlotsNotAvailable, RaiseAnErrorWithAReadableText)
{
    auto slots = allSlots();
    for (const auto &name : listed())
    {
        try
        {
            slots.at(name)();
            ADD_FAILURE() << name << " raises nothing";
        }
        catch (const git::LibGit2Exception &exception)
        {
            EXPECT_EQ(exception.getError().getCode(), GIT_ERROR) << name;
            const std::string text = asUtf8(exception.GetUnicodeMessageTxt());
            EXPECT_NE(text.find("not available in this build"), std::string::npos) << text;
        }
    }
}

TEST_F(SlotsNotAvailable, ChangeNothingInTheRepository)
{
    const auto before = stateOf(repository_);
    auto slots = allSlots();
    for (const auto &name : listed())
    {
        EXPECT_NE(raisedText(slots.at(name)), "") << name;
        EXPECT_EQ(stateOf(repository_), before) << name;
    }
}

} // namespace
