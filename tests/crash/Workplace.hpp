// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>
#include <filesystem>
#include <set>
#include <string>

#include "support/GitRepository.hpp"

namespace vclink::test
{

/// What a Worker works on: the working copy "repository" with the branches "main" and "topic", the
/// bare repositories "origin", which it pushes to, and "upstream", which it fetches and clones, and
/// the user's configuration.
class Workplace
{
  public:
    Workplace(const std::filesystem::path &folder, const std::filesystem::path &home);

    const std::filesystem::path &path() const noexcept
    {
        return folder_;
    }
    const GitRepository &repository() const noexcept
    {
        return repository_;
    }
    /// A commit on a branch of upstream that nobody has fetched.
    void advanceUpstream();

    /// Expects what no crash may harm, as the crash has left it: sound repositories in which every
    /// one of the commits can be reached, in origin what was pushed; readable configuration with
    /// all that was in it.
    void expectNothingLost(const std::set<std::string> &commits,
                           const std::set<std::string> &pushed) const;
    /// Removes the locks of a dead process.
    /// @return how many there were
    std::size_t removeLocks() const;
    bool isMerging() const;

  private:
    std::filesystem::path folder_;
    std::filesystem::path home_;
    GitRepository repository_;
    GitRepository source_;
    std::string configuration_;
};

} // namespace vclink::test
