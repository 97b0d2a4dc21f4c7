// SPDX-License-Identifier: MIT
// libgit2 takes C strings: a text with a NUL character would name another file, branch or
// repository there.
#include <filesystem>
#include <functional>
#include <memory>
#include <string>
#include <vector>

#include <git2/errors.h>
#include <gtest/gtest.h>

#include "TestOptionsFactory.hpp"
#include "main/remote/RemoteFixture.hpp"
#include "support/text.hpp"
#include "vclink/git/GitAdapterFactory.hpp"
#include "vclink/git/GitAttribute.hpp"
#include "vclink/git/GitAttributes.hpp"
#include "vclink/git/GitException.hpp"
#include "vclink/git/GitWorkingCopyGenerator.hpp"
#include "vclink/git/LibGit2Exception.hpp"
#include "vclink/git/messageIdentifiers.hpp"

namespace
{

namespace fs = std::filesystem;
namespace git = vclink::git;
using namespace vclink::test;

/// The text with a NUL behind it, and more behind that.
std::string cutByNul(const std::string &text)
{
    return text + std::string("\0x", 2);
}

struct NulCall
{
    const char *what;
    std::function<void()> call;
};

/// The LibGit2Exception that is thrown, by itself or as the cause of a failed merge.
std::string nulFailureOf(const std::function<void()> &call)
{
    try
    {
        call();
        return "none";
    }
    catch (const git::LibGit2Exception &exception)
    {
        return std::to_string(exception.getError().getCode()) + ' ' +
               std::to_string(exception.getError().getErrorClass()) + ' ' +
               asUtf8(exception.getError().getMessage());
    }
    catch (const git::GitException &exception)
    {
        EXPECT_EQ(exception.GetID(), "shared_vclink:git:MergeFailed");
        return asUtf8(exception.GetUnicodeMessageTxt());
    }
}

std::string nulRefusalOf(const std::string &text)
{
    return std::to_string(GIT_EINVALIDSPEC) + ' ' + std::to_string(GIT_ERROR_INVALID) + " '" +
           text + "\\0x' contains a NUL character";
}

/// "main" is checked out, "topic" has a commit more; "file" is changed, "new" is untracked.
class NulInTexts : public RemoteFixture
{
  protected:
    NulInTexts()
    {
        publish("other", "x");
        fetch();
        repository_.git({"checkout", "--quiet", "-B", "main", "origin/main"});
        repository_.git({"checkout", "--quiet", "-b", "topic"});
        commit("file", "of topic\n");
        repository_.git({"checkout", "--quiet", "main"});
        commit("file", "one\n");
        repository_.write("file", "two\n");
        repository_.write("new", "x");
    }

    /// A call for each text that an operation on the working copy takes. The text is "main" and the
    /// like, as the operation takes it, with a NUL behind it.
    std::vector<NulCall> callsOfAdapter() const;
    std::vector<NulCall> callsOfBranches() const;
    std::vector<NulCall> callsOfRemote() const;
    std::vector<NulCall> callsOfAttributes() const;
    std::vector<NulCall> calls() const;

    /// The operations of an adapter whose root has the NUL.
    static std::vector<NulCall> callsOn(git::GitAdapter &adapter, const upath &file);

    const std::unique_ptr<git::GitRemote> cutRemote_ =
        git::GitRemote::create(cutByNul("origin"), *adapter_);
    const std::unique_ptr<git::GitAttributes> attributes_ = git::GitAttributes::create(*adapter_);
};

std::vector<NulCall> NulInTexts::callsOfAdapter() const
{
    const upath file = pathOf(cutByNul("file"));
    const upath fresh = pathOf(cutByNul("new"));
    const std::vector<upath> second{pathOf("other"), file};
    return {{"addFiles", [=] { adapter_->addFiles({fresh}); }},
            {"removeFiles", [=] { adapter_->removeFiles({file}); }},
            {"removeFiles, the second", [=] { adapter_->removeFiles(second); }},
            {"revertFiles", [=] { adapter_->revertFiles({file}); }},
            {"revertFiles, the second", [=] { adapter_->revertFiles(second); }},
            {"markResolved", [=] { adapter_->markResolved(file); }},
            {"getFileStates", [=] { adapter_->getFileStates({file}); }},
            {"getFileStates, the second", [=] { adapter_->getFileStates(second); }},
            {"getFolderStates", [=] { adapter_->getFolderStates(pathOf(cutByNul("."))); }}};
}

std::vector<NulCall> NulInTexts::callsOfBranches() const
{
    using git::BranchParameters;
    return {{"getRevision", [=] { branches().getRevision(cutByNul("main")); }},
            {"getRevisionId", [=] { branches().getRevisionId(cutByNul("main")); }},
            {"switchBranch", [=] { branches().switchBranch(cutByNul("topic")); }},
            {"createBranch, the name",
             [=] { branches().createBranch(BranchParameters(cutByNul("fresh"), "main")); }},
            {"createBranch, the start point",
             [=] { branches().createBranch(BranchParameters("fresh", cutByNul("main"))); }},
            {"deleteBranch", [=] { branches().deleteBranch(cutByNul("topic")); }},
            {"merge", [=] { branches().merge(cutByNul("topic")); }}};
}

std::vector<NulCall> NulInTexts::callsOfRemote() const
{
    const std::vector<ustring> fetched{asUtf16(cutByNul("refs/heads/main:refs/heads/fetched"))};
    const std::vector<ustring> pushed{asUtf16(cutByNul("refs/heads/topic:refs/heads/topic"))};
    return {{"fetch, the name", [=] { cutRemote_->fetch({}); }},
            {"fetch, a refspec", [=] { remote().fetch(fetched); }},
            {"push, the name", [=] { cutRemote_->push({u"refs/heads/topic:refs/heads/topic"}); }},
            {"push, a refspec", [=] { remote().push(pushed); }},
            {"getRemoteHeads", [=] { cutRemote_->getRemoteHeads(); }}};
}

std::vector<NulCall> NulInTexts::callsOfAttributes() const
{
    return {{"getAttribute, the path",
             [=] { attributes_->getAttribute(asPath(cutByNul("file")), u"merge"); }},
            {"getAttribute, the name",
             [=] { attributes_->getAttribute(asPath("file"), asUtf16(cutByNul("merge"))); }}};
}

std::vector<NulCall> NulInTexts::calls() const
{
    std::vector<NulCall> all;
    for (const auto &some :
         {callsOfAdapter(), callsOfBranches(), callsOfRemote(), callsOfAttributes()})
        all.insert(all.end(), some.begin(), some.end());
    return all;
}

std::vector<NulCall> NulInTexts::callsOn(git::GitAdapter &adapter, const upath &file)
{
    const std::shared_ptr<git::BranchManager> branches = git::BranchManager::create(adapter);
    const std::shared_ptr<git::GitRemote> remote = git::GitRemote::create("origin", adapter);
    return {{"commit", [&adapter] { adapter.commit(upath(), u"message"); }},
            {"addFiles", [=, &adapter] { adapter.addFiles({file}); }},
            {"removeFiles", [=, &adapter] { adapter.removeFiles({file}); }},
            {"revertFiles", [=, &adapter] { adapter.revertFiles({file}); }},
            {"markResolved", [=, &adapter] { adapter.markResolved(file); }},
            {"getFileStates", [=, &adapter] { adapter.getFileStates({file}); }},
            {"getFolderStates", [=, &adapter] { adapter.getFolderStates(file); }},
            {"getLocalBranches", [=] { branches->getLocalBranches(); }},
            {"getRemoteBranches", [=] { branches->getRemoteBranches(); }},
            {"getHeadRevision", [=] { branches->getHeadRevision(); }},
            {"getRevision", [=] { branches->getRevision("main"); }},
            {"getRevisionId", [=] { branches->getRevisionId("main"); }},
            {"switchBranch", [=] { branches->switchBranch("topic"); }},
            {"createBranch",
             [=] {
                 branches->createBranch({"fresh", "main"});
             }},
            {"deleteBranch", [=] { branches->deleteBranch("topic"); }},
            {"getCurrentBranch", [=] { branches->getCurrentBranch(); }},
            {"merge", [=] { branches->merge("topic"); }},
            {"getRepositoryState", [=] { branches->getRepositoryState(); }},
            {"fetch", [=] { remote->fetch({}); }},
            {"push", [=] { remote->push({u"refs/heads/topic:refs/heads/topic"}); }},
            {"getRemoteHeads", [=] { remote->getRemoteHeads(); }},
            {"GitAttributes::create",
             [&adapter] { static_cast<void>(git::GitAttributes::create(adapter)); }}};
}

TEST_F(NulInTexts, AreRefusedAndNothingChanges)
{
    const NothingChanges nothing(repository_);
    const NothingChanges nothingThere(server_);
    for (const auto &[what, call] : calls())
    {
        const std::string failure = nulFailureOf(call);
        EXPECT_NE(failure.find("\\0x' contains a NUL character"), std::string::npos)
            << what << ": " << failure;
        if (what != std::string("merge"))
        {
            EXPECT_EQ(failure.find(std::to_string(GIT_EINVALIDSPEC) + ' '), 0U)
                << what << ": " << failure;
        }
    }
}

/// Without a repository to open, each would fail otherwise.
TEST_F(NulInTexts, AreRefusedBeforeAnythingIsOpened)
{
    fs::rename(repository_ / ".git", folder() / "moved");
    for (const auto &[what, call] : calls())
    {
        const std::string failure = nulFailureOf(call);
        EXPECT_NE(failure.find("\\0x' contains a NUL character"), std::string::npos)
            << what << ": " << failure;
    }
}

TEST_F(NulInTexts, TellTheWholeText)
{
    EXPECT_EQ(nulFailureOf([this] { branches().deleteBranch(cutByNul("topic")); }),
              nulRefusalOf("topic"));
    EXPECT_EQ(nulFailureOf([this] { remote().fetch({asUtf16(cutByNul("main"))}); }),
              nulRefusalOf("main"));
    EXPECT_EQ(nulFailureOf([this] { branches().deleteBranch(std::string(1, '\0')); }),
              std::to_string(GIT_EINVALIDSPEC) + ' ' + std::to_string(GIT_ERROR_INVALID) +
                  " '\\0' contains a NUL character");
}

TEST_F(NulInTexts, OfARootAreRefusedByEachOperation)
{
    const std::string root = repository_.path().string();
    const auto adapter = makeAdapter(cutByNul(root));
    EXPECT_EQ(adapter->getRootFolder(), asPath(cutByNul(root)));
    const NothingChanges nothing(repository_);
    for (const auto &[what, call] : callsOn(*adapter, pathOf("file")))
    {
        const std::string failure = nulFailureOf(call);
        EXPECT_NE(failure.find("'" + root + "\\0x' contains a NUL character"), std::string::npos)
            << what << ": " << failure;
    }
}

TEST_F(NulInTexts, OfAProbeAreRefused)
{
    const std::string root = repository_.path().string();
    for (const auto &path : {root, (folder() / "missing").string(), std::string()})
    {
        const auto probe = [&path]
        { git::GitAdapterFactory().isAdapterFor(asPath(cutByNul(path))); };
        EXPECT_EQ(nulFailureOf(probe), nulRefusalOf(path));
    }
}

TEST_F(NulInTexts, OfACloneAreRefusedAndNothingIsMade)
{
    const std::string server = nameOf(server_);
    const std::string target = folder() / "clone";
    git::GitWorkingCopyGenerator generator(interactor_);
    EXPECT_EQ(nulFailureOf([&] { generator.generate(asUtf16(cutByNul(server)), asPath(target)); }),
              nulRefusalOf(server));
    EXPECT_EQ(nulFailureOf([&] { generator.generate(asUtf16(server), asPath(cutByNul(target))); }),
              nulRefusalOf(target));
    auto factory = std::make_unique<TestOptionsFactory>(interactor_);
    factory->cloneOptions.checkoutBranch = cutByNul("main");
    git::GitWorkingCopyGenerator choosing(std::move(factory));
    EXPECT_EQ(nulFailureOf([&] { choosing.generate(asUtf16(server), asPath(target)); }),
              nulRefusalOf("main"));
    EXPECT_FALSE(fs::exists(target));
}

} // namespace
