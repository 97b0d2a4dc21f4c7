// SPDX-License-Identifier: MIT
#pragma once

#include <memory>

#include "vclink/git/export.hpp"

namespace vclink::git
{

class GitMergeDriverLookup;

/// Keeps libgit2 alive: git_libgit2_init at construction, git_libgit2_shutdown at destruction.
/// Guards nest by libgit2's own count; libgit2 lives from the first guard's construction to the
/// last one's destruction. A failure of either call goes unnoticed here, and shows in the next
/// libgit2 call.
///
/// Each guard registers the library's merge driver, which runs the commands that Git's
/// configuration names for `merge` attributes. libgit2 counts no registrations: the first guard
/// that ends takes the driver away for the whole process, until the next one begins. No guard, and
/// nothing that holds one, GitAdapterFactory::isAdapterFor included, may begin or end while another
/// thread merges.
///
/// Starting libgit2 costs 10 to 15 milliseconds, most of it for the system's certificates. A host
/// that probes many folders with GitAdapterFactory::isAdapterFor holds a guard of its own
/// meanwhile.
///
/// A guard may have static storage, and so may what holds one: the log outlives it. An object that
/// is put into a static variable later, such as a std::unique_ptr that main fills, must be gone
/// before main returns: the log may end before it.
///
/// Guards may be made and destroyed on any thread. Making one writes no record, and may throw
/// std::bad_alloc; libgit2 is then as it was before. If a log sink throws while a guard is
/// destroyed, the process terminates: hosts set boost::log::core::set_exception_handler.
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
