// SPDX-License-Identifier: MIT
// Every operation on a repository whose files somebody else has written: each ends with its result
// or with a typed exception, and nothing is written but the repository. Input: a character that
// says with which operation to begin, and the files, see HostileRepository.
#include <functional>
#include <memory>

#include <git2.h>

#include "Confinement.hpp"
#include "HostileRepository.hpp"
#include "check.hpp"
#include "error/errorUtil/OwnedHandle.hpp"
#include "foundation/core/except/IMsgIDException.hpp"
#include "main/files/GitAdapter.hpp"
#include "support/TestInteractor.hpp"
#include "support/text.hpp"
#include "vclink/FileStateMap.hpp"
#include "vclink/exception/SourceControlException.hpp"
#include "vclink/git/BranchManager.hpp"
#include "vclink/git/BranchParameters.hpp"
#include "vclink/git/BranchPointer.hpp"
#include "vclink/git/GitAdapterFactory.hpp"
#include "vclink/git/GitAttributes.hpp"
#include "vclink/git/GitRemote.hpp"
#include "vclink/git/GitRemoteHead.hpp"
#include "vclink/git/LibGit2Guard.hpp"

namespace
{

using namespace vclink;
using fuzz::require;
using test::asPath;

/// What all operations of one input are called on.
struct Subject
{
    std::filesystem::path root;
    std::shared_ptr<test::TestInteractor> interactor = std::make_shared<test::TestInteractor>();
    git::GitAdapter adapter{asPath(root), interactor};

    upath at(const char *name) const
    {
        return asPath(root / name);
    }
    std::unique_ptr<git::BranchManager> branches()
    {
        return git::BranchManager::create(adapter);
    }
    std::unique_ptr<git::GitRemote> origin()
    {
        return git::GitRemote::create("origin", adapter);
    }
};

using Operation = std::function<void(Subject &)>;

std::vector<Operation> adapterOperations()
{
    return {
        [](Subject &on) { git::GitAdapterFactory().isAdapterFor(asPath(on.root)); },
        [](Subject &on) { on.adapter.getFolderStates(asPath(on.root)); },
        [](Subject &on) { on.adapter.getFolderStates(on.at("sub")); },
        [](Subject &on) {
            on.adapter.getFileStates({on.at("file"), on.at("new"), on.at("sub/inside")});
        },
        [](Subject &on) {
            on.adapter.addFiles({on.at("new"), on.at("file")});
        },
        [](Subject &on) { on.adapter.removeFiles({on.at("other")}); },
        [](Subject &on) {
            on.adapter.revertFiles({on.at("file"), on.at("other"), on.at("link")});
        },
        [](Subject &on) { on.adapter.markResolved(on.at("file")); },
        [](Subject &on) { on.adapter.commit(upath(), u"a message"); },
        [](Subject &on)
        {
            const auto attributes = git::GitAttributes::create(on.adapter);
            serialize(attributes->getAttribute(upath(u"file"), u"merge"));
            serialize(attributes->getAttribute(upath(u"sub/inside"), u"text"));
        },
    };
}

std::vector<Operation> branchOperations()
{
    return {
        [](Subject &on)
        {
            for (const auto &branch : on.branches()->getLocalBranches())
                on.branches()->getRevision(branch.getName());
        },
        [](Subject &on) { on.branches()->getRemoteBranches(); },
        [](Subject &on) { on.branches()->getHeadRevision(); },
        [](Subject &on) { on.branches()->getRevisionId("topic^{tree}"); },
        [](Subject &on) { on.branches()->getCurrentBranch().getName(); },
        [](Subject &on) { on.branches()->getRepositoryState(); },
        [](Subject &on) { on.branches()->merge("quiet"); },
        [](Subject &on) { on.branches()->merge("topic"); },
        [](Subject &on) { on.branches()->switchBranch("topic"); },
        [](Subject &on) {
            on.branches()->createBranch({"fresh", "loose"});
        },
        [](Subject &on) {
            on.branches()->createBranch({"other", "tag"});
        },
        [](Subject &on) { on.branches()->deleteBranch("quiet"); },
    };
}

std::vector<Operation> remoteOperations()
{
    return {
        [](Subject &on) { on.origin()->fetch({}); },
        [](Subject &on) { on.origin()->push({u"refs/heads/main:refs/heads/ours"}); },
        [](Subject &on) { on.origin()->getRemoteHeads(); },
        // The repository as a remote, whose working copy is made within it.
        [](Subject &on)
        {
            git::GitAdapterFactory()
                .createWorkingCopyGenerator(on.interactor)
                ->generate(asPath(on.root).string(), on.at("clone"));
        },
    };
}

std::vector<Operation> allOperations()
{
    auto all = adapterOperations();
    for (const auto &more : {branchOperations(), remoteOperations()})
        all.insert(all.end(), more.begin(), more.end());
    return all;
}

/// Hosts distinguish failures by these exceptions; any other is a fault, and ends the process.
void run(const Operation &operation, Subject &subject)
{
    try
    {
        operation(subject);
    }
    catch (const foundation::core::except::IMsgIDException &exception)
    {
        exception.GetUnicodeMessageTxt();
    }
}

/// The working tree is a part of the repository, wherever its configuration says it is.
bool hasWorkingTreeElsewhere(const std::filesystem::path &root)
{
    git_repository *opened = nullptr;
    git_repository_open_ext(&opened, root.c_str(), GIT_REPOSITORY_OPEN_NO_SEARCH, nullptr);
    const git::OwnedHandle<git_repository> repository(opened);
    const char *const tree = opened == nullptr ? nullptr : git_repository_workdir(opened);
    return tree != nullptr && tree != root.string() + '/';
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t *data, std::size_t size)
{
    static const git::LibGit2Guard guard;
    static const fuzz::HostileRepository repository;
    static const auto operations = allOperations();
    static const auto surroundings = repository.surroundings();
    const std::string input = fuzz::bytesOf(data, size);
    if (fuzz::HostileRepository::isRefused(input))
        return -1;
    repository.environment().isolateLibGit2();
    repository.restore(input);

    fuzz::Confinement confinement({repository.path(), repository.origin(), repository.objects(),
                                   repository.environment().temporary()});
    Subject subject{repository.path()};
    const std::size_t first = size == 0 ? 0 : *data - std::size_t('A');
    for (std::size_t i = 0; i < operations.size(); ++i)
    {
        run(operations[(first + i) % operations.size()], subject);
        const std::string trespass = confinement.takeTrespass();
        require(trespass.empty() || hasWorkingTreeElsewhere(repository.path()), trespass.c_str());
    }
    require(repository.surroundings() == surroundings, "nothing appears beside the repository");
    return 0;
}
