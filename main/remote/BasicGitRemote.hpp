// SPDX-License-Identifier: MIT
#pragma once

#include <memory>
#include <string>
#include <vector>

#include "main/files/GitAdapter.hpp"
#include "vclink/git/GitRemote.hpp"

namespace vclink::git
{

/// A remote of a GitAdapter's working copy.
class BasicGitRemote : public GitRemote
{
  public:
    /// @param adapter outlives the object
    BasicGitRemote(const std::string &name, GitAdapter &adapter);
    ~BasicGitRemote() override;

    void fetch(const std::vector<ustring> &refspecs) override;
    void push(const std::vector<ustring> &refspecs) override;
    std::vector<GitRemoteHead> getRemoteHeads() const override;

  private:
    std::string name_;
    GitAdapter &adapter_;
    std::shared_ptr<GitOptionsFactory> optionsFactory_;
    GitCallbacks *callbacks_;
};

} // namespace vclink::git
