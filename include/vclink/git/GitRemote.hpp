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

/// Fetches from, pushes to and lists one remote of a working copy.
///
/// Each operation opens the repository of the adapter, looks up the remote in its configuration,
/// connects, runs to its end on the calling thread and keeps nothing: no connection stays open
/// between two calls. Use it on one thread at a time, the adapter's. The order of the operations is
/// part of the binary interface.
///
/// Every certificate and every host key is accepted: anyone who intercepts the connection can read
/// and modify it. There is no time limit: a silent remote blocks the operation, which cannot be
/// cancelled then. Plain paths, file://, git://, http://, https:// and ssh:// work as in libgit2.
/// The only credentials are the keys of the ssh agent that SSH_AUTH_SOCK names, with the user in
/// the URL, and a password in the URL. Nobody is prompted. No proxy is used.
///
/// Each operation throws LibGit2Exception with libgit2's text if a call to libgit2 fails, for
/// example if the repository does not have the remote, or if the remote cannot be reached or
/// refuses access. A name or refspec with a NUL character throws with GIT_EINVALIDSPEC before
/// anything is opened. SIGPIPE is blocked for the calling thread during an operation, so a broken
/// connection throws too.
class VCLINK_GIT_EXPORT GitRemote
{
  public:
    /// Creates an object for a remote. Looks up nothing: if the name is wrong, the first operation
    /// fails.
    /// @param name the remote's name, UTF-8, e.g. "origin"
    /// @param adapter must be from GitAdapterFactory, and must outlive the object
    /// @throws std::bad_cast for any other adapter
    [[nodiscard]] static std::unique_ptr<GitRemote> create(const std::string &name,
                                                           vclink::CMAdapter &adapter);

    GitRemote() = default;
    GitRemote(const GitRemote &) = delete;
    GitRemote &operator=(const GitRemote &) = delete;
    virtual ~GitRemote();

    /// Downloads objects from the remote and moves the references that the refspecs name, usually
    /// remote-tracking branches.
    ///
    /// Also downloads the tags that point to downloaded objects, and all tags of a repository on
    /// this machine. Keeps remote-tracking branches that the remote has deleted, unless its `prune`
    /// is configured. Does not change the working tree and the index, and changes a local branch
    /// only if a refspec names it. Does not fail if a refspec without '+' would move a reference to
    /// a commit that is not a descendant; the reference stays.
    ///
    /// Throws before any reference moves if libgit2 would lose a reference or its commits: if
    /// pruning would delete the target of a refspec without '*' whose source the remote lacks
    /// (GIT_ENOTFOUND), if a tag would be replaced without a '+' (GIT_EEXISTS), or if a branch, or
    /// another reference such as one to notes, would lose commits without a '+', for example in a
    /// shallow repository (GIT_ENONFASTFORWARD). Does not protect remote-tracking branches. Throws
    /// before anything is downloaded if libgit2 would remove .git/shallow (GIT_ERROR): 1.7 and 1.8
    /// always do, later releases if the remote is on this machine. Throws too if a refspec is
    /// negative, e.g. "^refs/heads/main" (GIT_ERROR).
    ///
    /// **Moves a branch even if a working tree has it checked out**, unlike git. The files and the
    /// index stay, so the next commit undoes what the branch got. With '+' commits of the branch
    /// can be lost: only the reflog has them. Check the targets of given and configured refspecs
    /// before the call.
    ///
    /// After a failure or a cancellation some objects may have been downloaded and some references
    /// moved. A cancellation request that ended a fetch also stops the next checkout of the adapter
    /// at its first file. git_remote_fetch; if refspecs and settings can lose something, before it
    /// git_remote_connect, git_remote_ls, git_remote_download.
    /// @param refspecs used unchanged, e.g. "+refs/heads/*:refs/remotes/origin/*"; an empty list
    /// means the configured ones
    /// @throws vclink::util::exception::CancelledOperationException if the application requested it
    /// before, or while objects arrive or the remote sends messages
    virtual void fetch(const std::vector<ustring> &refspecs) = 0;

    /// Uploads objects to the remote and moves its references.
    ///
    /// Does not fail if the remote rejects a reference by a hook or its settings: the remote's
    /// message is in the log only, and getRemoteHeads() returns the actual reference. Fails, and
    /// pushes nothing, if a branch cannot be fast-forwarded or a tag would be replaced, and the
    /// refspec does not begin with '+' (GIT_ENONFASTFORWARD).
    ///
    /// A repository on this machine accepts a push only if it is bare, and runs no hooks. The push
    /// fails, too, if it would write a tree there, also through a tag, if the repository's
    /// receive.denyDeletes or receive.denyNonFastForwards forbid it, if one of its linked working
    /// trees has the branch checked out, or if it would delete the current branch. **What another
    /// process pushes to the branch at the same moment can be overwritten.** git_remote_push; for a
    /// tag before it git_remote_connect, git_remote_ls.
    /// @param refspecs used unchanged, with full names, e.g. "refs/heads/main:refs/heads/main";
    /// ":NAME" deletes. An empty list means the configured ones, and pushes nothing if there are
    /// none
    /// @throws vclink::util::exception::CancelledOperationException if the application requested it
    /// and the remote then sends a message; a push cannot be cancelled at any other point
    virtual void push(const std::vector<ustring> &refspecs) = 0;

    /// Returns the references that the remote advertises, in its order; none for an empty remote.
    /// Lists the address for fetches, also if there is another one for pushes.
    /// git_remote_connect, git_remote_ls.
    virtual std::vector<GitRemoteHead> getRemoteHeads() const = 0;
};

} // namespace vclink::git
