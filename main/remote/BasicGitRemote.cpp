// SPDX-License-Identifier: MIT
#include "main/remote/BasicGitRemote.hpp"

#include <algorithm>
#include <cstddef>
#include <iterator>

#include <git2/net.h>
#include <git2/oid.h>
#include <git2/remote.h>

#include "error/errorUtil/GitResult.hpp"
#include "error/errorUtil/gitString.hpp"
#include "main/remote/SigpipeBlock.hpp"
#include "main/remote/fetchObstacles.hpp"
#include "main/remote/pushObstacles.hpp"
#include "options/gitRecords.hpp"
#include "util/path/PathspecArray.hpp"

namespace vclink::git
{
namespace
{

OwnedHandle<git_remote> lookupRemote(git_repository *repository, const char *name)
{
    return acquire<git_remote>(git_remote_lookup, repository, name).value();
}

/// Over a path, libgit2 lists the references at the address for pushes and writes to the other one.
void useAddressForPushes(git_remote *remote)
{
    const char *const address = git_remote_pushurl(remote);
    if (address != nullptr)
    {
        check(git_remote_set_instance_url, remote, address);
    }
}

GitRemoteHead::Id copyId(const git_oid &id)
{
    GitRemoteHead::Id copy = {};
    static_assert(copy.size() == sizeof(id.id));
    std::copy(std::begin(id.id), std::end(id.id), copy.begin());
    return copy;
}

std::string copyText(const char *text)
{
    return text != nullptr ? text : "";
}

GitRemoteHead copyHead(const git_remote_head &head)
{
    return {head.local, copyId(head.oid), copyId(head.loid), copyText(head.name),
            copyText(head.symref_target)};
}

/// The list belongs to the remote, and is destroyed with it.
std::vector<GitRemoteHead> copyHeads(const git_remote_head *const *heads, std::size_t count)
{
    std::vector<GitRemoteHead> copies;
    copies.reserve(count);
    std::transform(heads, heads + count, std::back_inserter(copies),
                   [](const git_remote_head *head) { return copyHead(*head); });
    return copies;
}

std::vector<GitRemoteHead> listHeads(git_remote *remote)
{
    const git_remote_head **heads = nullptr;
    std::size_t count = 0;
    const GitResult<void> listed = call(git_remote_ls, &heads, &count, remote);
    // Intentionally also after a success: every listing writes a record to the log.
    GitErrorPolicy::throwIfError(listed.has_error() ? listed.error() : GitError());
    return copyHeads(heads, count);
}

} // namespace

BasicGitRemote::BasicGitRemote(const std::string &name, GitAdapter &adapter)
    : name_(name), adapter_(adapter), optionsFactory_(adapter.getOptionsFactory()),
      callbacks_(&adapter.getCallbacks())
{
}

BasicGitRemote::~BasicGitRemote() = default;

void BasicGitRemote::fetch(const std::vector<ustring> &refspecs)
{
    const SigpipeBlock sigpipe;
    const char *const name = asGitString(name_);
    const PathspecArray array = makeStringPathspec(refspecs);
    const OwnedHandle<git_repository> repository = adapter_.getRepository();
    const OwnedHandle<git_remote> remote = lookupRemote(repository.get(), name);
    const FetchOptions options = optionsFactory_->makeFetchOptions();
    const git_fetch_options record = toGitFetchOptions(options, *callbacks_);
    refuseFetchThatLoses(repository.get(), remote.get(), array, record);
    check(git_remote_fetch, remote.get(), getArrayPointer(array), &record, nullptr);
}

void BasicGitRemote::push(const std::vector<ustring> &refspecs)
{
    const SigpipeBlock sigpipe;
    const char *const name = asGitString(name_);
    const PathspecArray array = makeStringPathspec(refspecs);
    const OwnedHandle<git_repository> repository = adapter_.getRepository();
    const OwnedHandle<git_remote> remote = lookupRemote(repository.get(), name);
    useAddressForPushes(remote.get());
    const PushOptions options = optionsFactory_->makePushOptions();
    const git_push_options record = toGitPushOptions(options, *callbacks_);
    refusePushThatLoses(repository.get(), remote.get(), array, record);
    check(git_remote_push, remote.get(), getArrayPointer(array), &record);
}

std::vector<GitRemoteHead> BasicGitRemote::getRemoteHeads() const
{
    const SigpipeBlock sigpipe;
    const char *const name = asGitString(name_);
    const OwnedHandle<git_repository> repository = adapter_.getRepository();
    const OwnedHandle<git_remote> remote = lookupRemote(repository.get(), name);
    const ProxyOptions options = optionsFactory_->makeProxyOptions();
    const git_remote_callbacks callbacks = toGitRemoteCallbacks(callbacks_->remoteCallbacks());
    const git_proxy_options proxy = toGitProxyOptions(options, callbacks_->proxyCallbacks());
    check(git_remote_connect, remote.get(), GIT_DIRECTION_FETCH, &callbacks, &proxy, nullptr);
    return listHeads(remote.get());
}

GitRemote::~GitRemote() = default;

std::unique_ptr<GitRemote> GitRemote::create(const std::string &name, vclink::CMAdapter &adapter)
{
    return std::make_unique<BasicGitRemote>(name, dynamic_cast<GitAdapter &>(adapter));
}

} // namespace vclink::git
