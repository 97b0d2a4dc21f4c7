// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <string>
#include <vector>

#include "support/GitRepository.hpp"
#include "support/HermeticEnvironment.hpp"
#include "support/TemporaryFolder.hpp"

namespace vclink::fuzz
{

/// A working copy with two branches that conflict and one that does not, and a bare repository
/// beside it, both as they were at each restore() but for the files that an input replaces.
class HostileRepository
{
  public:
    HostileRepository();

    /// Whether libgit2 would ask for all memory, as it is known to do of some indexes.
    static bool isRefused(const std::string &input);

    /// Makes both repositories again, then writes the files in the input: after a line "@@ NAME"
    /// everything up to the next such line. Files that Git keeps in the working tree are written
    /// there, others into its folder; unknown names are left out. "$TOP" in a configuration means
    /// top(), and an index gets the checksum of its content.
    void restore(const std::string &input) const;

    /// What lies around the two repositories. Nothing writes there.
    const std::filesystem::path &top() const noexcept
    {
        return folder_.path();
    }
    std::filesystem::path path() const
    {
        return run_ / "repository";
    }
    std::filesystem::path origin() const
    {
        return run_ / "origin";
    }
    /// The folder with the objects of both, which are recognised by their time.
    std::filesystem::path objects() const
    {
        return folder_ / "objects";
    }
    const test::HermeticEnvironment &environment() const noexcept
    {
        return environment_;
    }
    /// The names beside the two repositories, and what is in the file there.
    std::vector<std::string> surroundings() const;

  private:
    test::TemporaryFolder folder_;
    test::HermeticEnvironment environment_{folder_.path()};
    std::filesystem::path template_ = folder_ / "template";
    std::filesystem::path run_ = folder_ / "run";
};

} // namespace vclink::fuzz
