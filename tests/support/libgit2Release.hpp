// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <string_view>

#include <git2/deprecated.h> // LIBGIT2_VER_MAJOR, of which 1.8 has made another name
#include <git2/errors.h>
#include <git2/version.h>

/// The differences between releases of libgit2 on which tests depend, a line for each. Tests have
/// no other conditions on a release. 1.5 and 1.9 were tried. The releases between them are from
/// libgit2's history: if it does not show which one brought a difference, it counts as 1.9's.
namespace vclink::test::libgit2_release
{

constexpr bool isSince(int major, int minor)
{
    return LIBGIT2_VER_MAJOR > major || (LIBGIT2_VER_MAJOR == major && LIBGIT2_VER_MINOR >= minor);
}

/// Looking a remote up loses memory, more with every entry of the configuration.
constexpr bool losesMemory = !isSince(1, 6);

/// An ssh connection loses the list of known hosts and the paths of its file.
constexpr bool losesKnownHosts = !isSince(1, 8);

/// A lock of a configuration file that is not committed also closes the file.
constexpr bool closesLockedFile = !isSince(1, 8);

/// Looking up a value in a file that was broken after it was opened ends the process.
constexpr bool endsAtBrokenFiles = isSince(1, 9);

/// GIT_CHECKOUT_SAFE. 0 is the dry run before.
constexpr unsigned safeCheckout = isSince(1, 9) ? 0 : 1;

/// The code with which a repository of SHA-256 objects is refused.
constexpr int refusalOfSha256 = isSince(1, 6) ? GIT_EINVALID : GIT_ERROR;
/// The code with which a repository with extensions.worktreeConfig is refused, or 0.
constexpr int refusalOfWorktreeConfig = isSince(1, 8) ? GIT_OK : GIT_ERROR;

/// safe.directory is honoured where it is "*".
constexpr bool trustsStar = isSince(1, 6);
/// Another's repository is refused in the same way where safe.directory is not set at all.
constexpr bool needsNoSafeDirectory = isSince(1, 6);
/// What follows the path of another's repository in the text of its refusal.
constexpr std::string_view endOfOwnedPath = isSince(1, 9) ? "" : "/";

/// What is cut from the ends of the name of a person, besides white space.
constexpr std::string_view noiseOfNames = isSince(1, 8) ? ",:;" : ".,:;";

/// Between "could not find repository " and the folder.
constexpr std::string_view whereNoRepositoryIs = isSince(1, 7) ? "at" : "from";
/// A part of the text about an address with an unknown scheme.
inline std::string refusalOfScheme(const std::string &address)
{
    return isSince(1, 9) ? "invalid argument: 'port'" : address;
}

/// A regular expression for the text if an ssh server accepts no further keys. It depends on the
/// moment in which the server hangs up.
constexpr const char *endOfSshTries =
    isSince(1, 9) ? "Failed getting response|Unable to send userauth-none request"
                  : "Failed to retrieve list of SSH authentication methods";
/// A missing ssh agent is reported at the first request for credentials. Later releases ask again
/// until the server has had enough.
constexpr bool tellsOfMissingAgent = !isSince(1, 9);

/// The failure of a fetch into a shallow repository, 0 if there is none. Earlier releases look for
/// the missing commits before they ask a server for new ones; later ones would lose .git/shallow
/// over a path, which the library refuses.
constexpr int failureOfShallowFetch(bool isByPath)
{
    if (isByPath)
        return isSince(1, 7) ? GIT_ERROR : GIT_OK;
    return isSince(1, 9) ? GIT_OK : isSince(1, 7) ? GIT_ERROR : GIT_ENOTFOUND;
}

/// A remote with a negative refspec in its configuration cannot be looked up.
constexpr bool refusesNegativeRefspecs = !isSince(1, 9);

/// A merge takes an empty file for the deleted empty one under another name, and the library
/// refuses it.
constexpr bool takesEmptyForRenamed = !isSince(1, 8);

/// Whether libgit2 reports no failure: then there is no record, or one that says so.
inline bool isSilent()
{
    const git_error *const record = git_error_last();
    return record == nullptr || (isSince(1, 8) && record->klass == GIT_ERROR_NONE &&
                                 std::string_view(record->message) == "no error");
}

} // namespace vclink::test::libgit2_release
