// SPDX-License-Identifier: MIT
#pragma once

#include <memory>

#include "vclink/git/export.hpp"

namespace vclink::git
{

class GitMergeDriverLookup;

/// Keeps libgit2 alive. Calls git_libgit2_init at construction and git_libgit2_shutdown at
/// destruction.
///
/// Guards nest: libgit2 counts the calls, and lives from the construction of the first guard to the
/// destruction of the last one. A guard ignores a failure of these calls; the next libgit2 call
/// fails.
///
/// Each guard registers the library's merge driver, which runs the commands that Git's
/// configuration names for `merge` attributes. libgit2 does not count registrations: the first
/// guard that ends removes the driver for the whole process, until the next guard begins. Without
/// it a merge ignores these commands, and reports nothing: make a guard right before each merge.
/// While another thread merges, no guard may begin or end, and neither may an object that holds
/// one, nor a call of GitAdapterFactory::isAdapterFor. Otherwise that merge ignores the commands,
/// or the process crashes.
///
/// Starting libgit2 takes some milliseconds of processor time, most of it for the system's
/// certificates. Hold a guard while you probe many folders with GitAdapterFactory::isAdapterFor.
///
/// A guard, or an object that holds one, can be a static object: the log outlives it. If it is put
/// into a static variable later, such as a std::unique_ptr that main fills, it must be destroyed
/// before main returns. Otherwise the log may end before it, and the process crashes.
///
/// Guards can be created and destroyed on any thread. The constructor writes no record and can
/// throw std::bad_alloc; then libgit2 is as before. If a log sink throws while a guard is
/// destroyed, the process terminates: set boost::log::core::set_exception_handler.
class VCLINK_GIT_EXPORT LibGit2Guard
{
  public:
    [[nodiscard]] LibGit2Guard();
    LibGit2Guard(const LibGit2Guard &) = delete;
    LibGit2Guard &operator=(const LibGit2Guard &) = delete;
    ~LibGit2Guard();

  private:
    std::unique_ptr<GitMergeDriverLookup> drivers_;
};

} // namespace vclink::git
