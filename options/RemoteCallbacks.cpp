// SPDX-License-Identifier: MIT
#include "options/RemoteCallbacks.hpp"

#include <string>

#include <git2/errors.h>

#include "error/errorUtil/libgit2Errors.hpp"
#include "error/logging/logger.hpp"

namespace vclink::git
{

RemoteCallbacks::RemoteCallbacks(ApplicationInteractor &interactor)
    : interactor_(interactor), poller_(interactor)
{
}

int RemoteCallbacks::sidebandProgress(const char *text, int length)
{
    poller_.throwIfCancelled();
    const std::string msgStr(text, static_cast<std::size_t>(length));
    writeRecord(SeverityParameter, " msgStr=", msgStr);
    return 0;
}

int RemoteCallbacks::completion(git_remote_completion_t type)
{
    writeRecord(SeverityParameter, " type=", static_cast<unsigned>(type));
    return 0;
}

int RemoteCallbacks::credentials(git_credential **out, const char *url, const char *usernameFromUrl,
                                 unsigned int allowedTypes)
{
    writeRecord(SeverityParameter, " url=", url, " username_from_url=", usernameFromUrl,
                " allowed_types=", allowedTypes);
    // libgit2 sets no text if this fails. Without this call, the text of an earlier failure, such
    // as a setting that is not set, would appear as the reason.
    git_error_clear();
    if ((allowedTypes & GIT_CREDENTIAL_SSH_KEY) != 0)
    {
        return git_credential_ssh_key_from_agent(out, usernameFromUrl);
    }
    return GIT_ERROR;
}

int RemoteCallbacks::certificateCheck(git_cert * /*cert*/, int valid, const char *host)
{
    writeRecord(SeverityParameter, " valid=", valid, " host=", host);
    // Intentionally 0, which makes libgit2 continue: no certificate stops a connection.
    return valid;
}

int RemoteCallbacks::transferProgress(const git_indexer_progress *stats)
{
    poller_.throwIfCancelled();
    // Intentionally without a separator.
    writeRecord(SeverityProgress, "Transfer Progress (Objects / Bytes): ", stats->total_objects,
                stats->received_bytes);
    return 0;
}

int RemoteCallbacks::updateTips(const char *refname, const git_oid * /*oldId*/,
                                const git_oid * /*newId*/)
{
    writeRecord(SeverityParameter, " ref=", refname);
    return 0;
}

int RemoteCallbacks::packProgress(int stage, unsigned int current, unsigned int total)
{
    writeRecord(SeverityParameter, " stage=", stage, " current=", current, " total=", total);
    return 0;
}

int RemoteCallbacks::pushTransferProgress(unsigned int current, unsigned int total,
                                          std::size_t bytes)
{
    writeRecord(SeverityParameter, " current=", current, " total=", total, " bytes=", bytes);
    return 0;
}

int RemoteCallbacks::pushUpdateReference(const char *refname, const char *status)
{
    const std::string refnameStr = refname != nullptr ? refname : "";
    const std::string statusStr = status != nullptr ? status : "";
    writeRecord(SeverityParameter, " refnameStr=", refnameStr, " statusStr=", statusStr);
    // Intentionally also after a rejection.
    return 0;
}

int RemoteCallbacks::pushNegotiation(const git_push_update ** /*updates*/, std::size_t length)
{
    writeRecord(SeverityParameter, " len=", length);
    return 0;
}

} // namespace vclink::git
