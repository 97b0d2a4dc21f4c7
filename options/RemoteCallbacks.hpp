// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>

#include <git2/credential.h>
#include <git2/indexer.h>
#include <git2/oid.h>
#include <git2/remote.h>

#include "options/CancellationPoller.hpp"
#include "vclink/ApplicationInteractor.hpp"

namespace vclink::git
{

/// The callbacks of a connection to a remote, for cancellation, the ssh agent, and the log. They
/// never prompt and report no progress. libgit2 calls the members through the callback bridge;
/// strings belong to libgit2 and are logged unchanged.
class RemoteCallbacks
{
  public:
    /// @param interactor outlives the set
    explicit RemoteCallbacks(ApplicationInteractor &interactor);

    /// git_transport_message_cb, for messages of the server. A poll point, the only one of a push.
    /// @param text `length` bytes, not terminated
    /// @return 0
    /// @throws vclink::util::exception::CancelledOperationException
    int sidebandProgress(const char *text, int length);

    /// For the log only.
    /// @return 0
    int completion(git_remote_completion_t type);

    /// git_credential_acquire_cb. Offers the keys of the ssh agent each time libgit2 asks, if ssh
    /// keys are accepted, and nothing otherwise. libgit2 decides when to stop asking.
    /// @param out owned by libgit2
    /// @return 0, or libgit2's code: that of git_credential_ssh_key_from_agent, or -1 if no ssh key
    /// is accepted
    int credentials(git_credential **out, const char *url, const char *usernameFromUrl,
                    unsigned int allowedTypes);

    /// git_transport_certificate_check_cb. Accepts every certificate and every host key.
    /// @return `valid`: with 0 libgit2 continues, with 1 it uses its own result, which was good
    int certificateCheck(git_cert *cert, int valid, const char *host);

    /// git_indexer_progress_cb. A poll point.
    /// @return 0
    /// @throws vclink::util::exception::CancelledOperationException
    int transferProgress(const git_indexer_progress *stats);

    /// For the log only.
    /// @return 0
    int updateTips(const char *refname, const git_oid *oldId, const git_oid *newId);

    /// git_packbuilder_progress, for the log only.
    /// @return 0
    int packProgress(int stage, unsigned int current, unsigned int total);

    /// git_push_transfer_progress_cb, for the log only.
    /// @return 0
    int pushTransferProgress(unsigned int current, unsigned int total, std::size_t bytes);

    /// git_push_update_reference_cb, for the log only: a reference that the server rejects is not a
    /// failure.
    /// @param status the server's reason for a rejection, otherwise null
    /// @return 0
    int pushUpdateReference(const char *refname, const char *status);

    /// git_push_negotiation, for the log only.
    /// @return 0
    int pushNegotiation(const git_push_update **updates, std::size_t length);

  private:
    [[maybe_unused]] ApplicationInteractor &interactor_;
    CancellationPoller poller_;
};

} // namespace vclink::git
