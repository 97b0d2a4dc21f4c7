// SPDX-License-Identifier: MIT
#pragma once

#include <memory>
#include <string>
#include <vector>

#include "fl/ustring.hpp"
#include "vclink/CMAdapter.hpp"
#include "vclink/git/GitRemoteHead.hpp"
#include "vclink/git/export.hpp"

namespace vclink::git
{

/// One remote of a working copy, by its name. Each operation opens the repository of the adapter,
/// looks the remote up in its configuration, connects, runs to its end on the calling thread and
/// keeps nothing: there is no connection between two calls. For one thread at a time, as its
/// adapter.
///
/// Access: plain paths, file://, git://, http://, https:// and ssh:// as libgit2 has them. The only
/// credentials are the keys of the ssh agent that SSH_AUTH_SOCK names, with the user that the URL
/// names, and a password that stands in the URL; nobody is asked for anything. No proxy is used.
/// Every certificate and every host key is accepted. There is no time limit: a remote that stays
/// silent keeps the operation waiting.
///
/// Each operation throws LibGit2Exception, with libgit2's text, when a call to libgit2 fails: a
/// name that the repository does not know, a remote that can't be reached or that refuses access.
/// A name or refspec with a NUL character is refused with GIT_EINVALIDSPEC before anything is
/// opened.
/// Meanwhile SIGPIPE is blocked for the calling thread, so that a broken connection is such a
/// failure too. The order of the operations is binding.
class VCLINK_GIT_EXPORT GitRemote
{
  public:
    /// Nothing is looked up yet: a name that is wrong shows at the first operation.
    /// @param name the remote's name, UTF-8, e.g. "origin"
    /// @param adapter one that GitAdapterFactory has made; must outlive the object
    /// @throws std::bad_cast for any other adapter
    [[nodiscard]] static std::unique_ptr<GitRemote> create(const std::string &name,
                                                           vclink::CMAdapter &adapter);

    GitRemote() = default;
    GitRemote(const GitRemote &) = delete;
    GitRemote &operator=(const GitRemote &) = delete;
    virtual ~GitRemote();

    /// Takes objects from the remote and moves the references that the refspecs name,
    /// remote-tracking branches as a rule. Tags come along that point at what was taken, of a
    /// repository on this machine all of them; branches that the remote has deleted stay unless its
    /// `prune` is configured. Working tree, index and local branches stay as they are, unless a
    /// refspec names one. After a failure or a cancellation objects may have been taken, and
    /// references moved in part. A request for cancellation that ended a fetch still stops the next
    /// checkout of the adapter at its first file. git_remote_fetch.
    /// @param refspecs taken as they stand, e.g. "+refs/heads/*:refs/remotes/origin/*"; an empty
    /// list means those that are configured
    /// @throws vclink::util::exception::CancelledOperationException when the application asked for
    /// it before, or while objects come in or the remote talks
    virtual void fetch(const std::vector<ustring> &refspecs) = 0;

    /// Gives objects to the remote and moves its references. A reference that the remote rejects,
    /// by a hook or by its settings, counts as done: its words are in the log only, and
    /// getRemoteHeads() shows where the reference stands. One that can't be fast-forwarded, and
    /// whose refspec does not begin with '+', is a failure, and then nothing is pushed. A
    /// repository on this machine takes a push only when it is bare, and runs no hooks.
    /// git_remote_push.
    /// @param refspecs taken as they stand, with full names, e.g.
    /// "refs/heads/main:refs/heads/main"; ":NAME" deletes. An empty list means those that are
    /// configured, and pushes nothing where none are
    /// @throws vclink::util::exception::CancelledOperationException when the application asked for
    /// it and the remote then talks; at no other moment can a push be stopped
    virtual void push(const std::vector<ustring> &refspecs) = 0;

    /// What the remote advertises, in its order; nothing for an empty remote.
    /// git_remote_connect, git_remote_ls.
    virtual std::vector<GitRemoteHead> getRemoteHeads() const = 0;
};

} // namespace vclink::git
