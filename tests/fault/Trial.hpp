// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <string>
#include <vector>

#include "Operation.hpp"
#include "support/GitRepository.hpp"
#include "support/HermeticEnvironment.hpp"
#include "support/RepositoryState.hpp"

namespace vclink::test
{

/// Whether every fault is asked for, and every check after it, rather than the share that a test
/// run has the time for: the environment variable VCLINK_ALL_FAULTS is set.
bool wantsAllFaults();

/// An operation that is tried again and again, from the same beginning each time. libgit2 runs.
class Trial
{
  public:
    /// Has the operation run once, with nothing failing.
    /// @param folder is made; the content of the home folder is overwritten
    Trial(const Operation &operation, std::filesystem::path folder,
          const HermeticEnvironment &environment);

    /// Puts the working copy and the user's configuration back to where they began.
    /// @return the operation on them, to be called
    Action begin();
    /// What the operation runs on. The end of another adapter would take the merge driver from it.
    git::GitAdapter &adapter() const noexcept
    {
        return *adapter_;
    }
    const GitRepository &repository() const noexcept
    {
        return repository_;
    }

    /// What the working copy and the repository hold, for comparison, without what differs from run
    /// to run.
    std::string gist() const;
    /// How the operation ends when nothing fails, and what it leaves.
    const std::string &normalOutcome() const noexcept
    {
        return normalOutcome_;
    }
    const std::string &normalGist() const noexcept
    {
        return normalGist_;
    }

    /// Expects after these calls of libgit2 what they allow: without one that writes, all is as it
    /// began, to the byte; without one that moves a reference, all references are; and a merge that
    /// is written and not committed is under way.
    void expectWrittenByThese(const std::vector<std::string> &calls) const;
    /// Expects a repository in order, without a lock.
    void expectSound() const;
    /// Expects that the operation does its work when it is called again, at once or, where the
    /// first call left something behind, after git has cleared it away.
    void expectWorksAgain(const Action &action) const;

    /// Closes the descriptors of such locks as libgit2 leaves behind.
    void closeWhatLibGit2Leaves() const;

  private:
    /// Every file but objects, which nobody misses who has no reference to them.
    RepositoryState::Entries files() const;
    /// Whether libgit2 leaves this lock if a call below it fails in the middle of its writing:
    /// FETCH_HEAD's, MERGE_MSG's, and that of a file in conflict, which it leaves open besides.
    bool isLeftByLibGit2(const std::filesystem::path &file) const;
    void removeWhatLibGit2Leaves() const;

    const Operation &operation_;
    std::filesystem::path folder_;
    std::filesystem::path home_;
    GitRepository repository_;
    std::shared_ptr<git::GitAdapter> adapter_;
    RepositoryState::Entries beginning_;
    std::string normalOutcome_;
    std::string normalGist_;
};

} // namespace vclink::test
