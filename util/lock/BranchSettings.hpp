// SPDX-License-Identifier: MIT
#pragma once

#include <memory>
#include <string>

#include <git2/types.h>

#include "error/errorUtil/OwnedHandle.hpp"
#include "util/scope/KeptMode.hpp"

namespace vclink::git
{

/// The settings of one branch in the repository's own configuration file, to be removed with it.
///
/// git_branch_delete would remove them itself, one by one, from whatever it finds by a pattern: for
/// the branch `1` also those of the branch `1.2`. It fails, after a part of them is gone, if the
/// user's configuration or an included file has a setting of the branch, or if one has two values.
/// git removes what is in the repository's own file, and nothing else.
class BranchSettings
{
  public:
    /// Locks the file if it has settings of the branch. git_config_open_ondisk,
    /// git_config_foreach, git_config_lock, git_config_delete_entry,
    /// git_config_delete_multivar.
    /// @throws LibGit2Exception, with the code GIT_ELOCKED if another process has locked the file
    BranchSettings(git_repository *repository, const std::string &branch);
    BranchSettings(const BranchSettings &) = delete;
    BranchSettings &operator=(const BranchSettings &) = delete;
    /// Leaves the file as it was unless it is written.
    ~BranchSettings();

    /// Writes the file without the settings. git_transaction_commit.
    /// @throws LibGit2Exception
    void remove();

  private:
    /// Ends a lock. Nothing is written unless it was committed.
    struct Unlock
    {
        /// The locked file, until the lock is committed.
        OwnedHandle<git_config> *file;
        void operator()(git_transaction *lock) const noexcept;
    };

    KeptMode mode_;
    OwnedHandle<git_config> file_;
    /// Null if there are none.
    std::unique_ptr<git_transaction, Unlock> lock_;
};

/// Lets a repository have no configuration in a scope.
class WithoutConfiguration
{
  public:
    /// git_repository_config, git_config_new, git_repository_set_config.
    /// @throws LibGit2Exception
    [[nodiscard]] explicit WithoutConfiguration(git_repository *repository);
    WithoutConfiguration(const WithoutConfiguration &) = delete;
    WithoutConfiguration &operator=(const WithoutConfiguration &) = delete;
    ~WithoutConfiguration();

  private:
    git_repository *repository_;
    OwnedHandle<git_config> before_;
};

} // namespace vclink::git
