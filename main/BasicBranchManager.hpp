// SPDX-License-Identifier: MIT
#pragma once

#include <memory>
#include <string>
#include <vector>

#include <git2/oid.h>

#include "main/files/GitAdapter.hpp"
#include "vclink/git/BranchManager.hpp"

namespace vclink::git
{

/// The branches of a GitAdapter's working copy.
class BasicBranchManager : public BranchManager
{
  public:
    /// @param adapter outlives the manager
    explicit BasicBranchManager(GitAdapter &adapter);
    ~BasicBranchManager() override;

    std::vector<BranchPointer> getLocalBranches() const override;
    std::vector<BranchPointer> getRemoteBranches() const override;
    std::string getHeadRevision() const override;
    std::string getRevision(const std::string &revision) const override;
    git_oid getRevisionId(const std::string &revision) const override;
    void switchBranch(const BranchName &name) override;
    void createBranch(const BranchParameters &parameters) override;
    void deleteBranch(const BranchName &name) override;
    BranchPointer getCurrentBranch() const override;
    void merge(BranchName name) override;
    std::string getRepositoryState() const override;

  private:
    GitAdapter &adapter_;
    std::shared_ptr<GitOptionsFactory> optionsFactory_;
    GitCallbacks *callbacks_;
};

/// Returns the text of getRepositoryState() for a git_repository_state_t, or nothing for any other
/// number.
std::string describeRepositoryState(int state);

} // namespace vclink::git
