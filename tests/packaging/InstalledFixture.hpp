// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <string>
#include <vector>

#include "support/Command.hpp"
#include "support/GitFixture.hpp"
#include "support/GitRepository.hpp"

namespace vclink::test
{

/// Runs a program that must succeed, and may take its time to compile.
/// @return what it wrote to standard output
/// @throws std::runtime_error with all its words when it fails
std::string runToSuccess(Command command);

/// The files and links below a folder, relative to it, in order.
std::vector<std::string> filesBelow(const std::filesystem::path &folder);

/// Base of the tests of what is installed.
class InstalledFixture : public GitFixture
{
  protected:
    /// Installs components of the build, without symbols for debuggers.
    void install(const std::filesystem::path &prefix,
                 const std::vector<std::string> &components) const;
    /// Installs all that a host's developer needs, and moves it elsewhere.
    /// @return the new place
    std::filesystem::path installAndMove() const;

    /// Configures and builds a project against the installation in `prefix`, in a new folder.
    /// @return that folder
    std::filesystem::path buildAgainst(const std::filesystem::path &prefix,
                                       const std::filesystem::path &project) const;

    /// A working copy that has something of everything.
    GitRepository makeWorkingCopy() const;
    /// What examples/embed says of it.
    static std::string describeWorkingCopy(const GitRepository &repository);
};

} // namespace vclink::test
