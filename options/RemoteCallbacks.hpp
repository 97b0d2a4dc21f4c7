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

/// What libgit2 talks to while it talks to a remote: cancellation, the ssh agent, and the log. The
/// application is asked nothing and sees no progress. Its members are reached through the callback
/// bridge; strings belong to libgit2 and are as it has them.
class RemoteCallbacks
{
  public:
    /// @param interactor outlives the set
    explicit RemoteCallbacks(ApplicationInteractor &interactor);

    /// git_transport_message_cb, for text of the server's. A poll point, the only one of a push.
    /// @param text `length` bytes, not terminated
    /// @return 0
    /// @throws vclink::util::exception::CancelledOperationException
    int sidebandProgress(const char *text, int length);

    /// For the log only.
    /// @return 0
    int completion(git_remote_completion_t type);

    /// git_credential_acquire_cb. Offers the keys of the ssh agent where ssh keys are taken, each
    /// time it is asked, and nothing anywhere else. The end of an exchange is libgit2's to find.
    /// @param out owned by libgit2
    /// @return 0, or libgit2's code: git_credential_ssh_key_from_agent, -1 where no ssh key is
    /// taken
    int credentials(git_credential **out, const char *url, const char *usernameFromUrl,
                    unsigned int allowedTypes);

    /// git_transport_certificate_check_cb. Accepts every certificate and every host key.
    /// @return `valid`: for libgit2 0 goes ahead, and 1 keeps its own finding, which was good
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

    /// git_push_update_reference_cb, for the log only: a reference that the server rejects counts
    /// as done.
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
