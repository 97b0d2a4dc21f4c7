// SPDX-License-Identifier: MIT
#pragma once

#include <memory>
#include <string>
#include <vector>

#include "main/AdapterFixture.hpp"
#include "resource_core/BaseMsgID.hpp"
#include "support/Change.hpp"
#include "support/Failure.hpp"
#include "support/RepositoryState.hpp"
#include "support/strings.hpp"
#include "support/text.hpp"
#include "vclink/git/BranchManager.hpp"

namespace vclink::test
{

/// A message's text in the language of the process.
std::string textOf(const resource_core::BaseMsgID &message);
/// The text of a LibGit2Exception with this failure.
std::string textOf(const Failure &failure);

/// Base of the fixtures whose tests run a branch manager, each on an adapter of its own, over a
/// repository that has an identity in its configuration and nothing else.
class BranchFixture : public AdapterFixture
{
  protected:
    BranchFixture();

    git::BranchManager &branches() const
    {
        return *manager_;
    }
    upath pathOf(const std::string &name) const
    {
        return asPath(repository_.path().string() + '/' + name);
    }
    /// The id that git finds for a revision.
    std::string idOf(const std::string &revision) const;
    /// The branch that HEAD names, as git reports it; empty if it is detached.
    std::string currentBranch() const;
    /// git's status, an entry a path.
    std::vector<std::string> status() const;
    /// Makes the branch at `start`, has `change` committed there and comes back to main.
    void makeBranch(const std::string &name, const Change &change,
                    const std::string &start = "main")
    {
        repository_.makeBranch(name, change, start);
    }

    GitRepository repository_ = makeRepository();
    const std::unique_ptr<git::GitAdapter> adapter_ = makeAdapter(repository_.path());

  private:
    const std::unique_ptr<git::BranchManager> manager_ = git::BranchManager::create(*adapter_);
};

std::vector<std::string> namesOf(const std::vector<git::BranchPointer> &branches);

} // namespace vclink::test
