// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <functional>
#include <memory>
#include <set>
#include <string>
#include <vector>

#include "GitReport.hpp"
#include "Random.hpp"
#include "expectedStates.hpp"
#include "support/GitRepository.hpp"
#include "vclink/CMAdapter.hpp"
#include "vclink/FileState.hpp"
#include "vclink/FileStateMap.hpp"

namespace vclink::test
{

/// A working copy, what git says of it, and the library's adapter for it.
class Comparison
{
  public:
    /// @param seed chooses what is asked besides the root
    Comparison(const GitRepository &repository, std::uint64_t seed);

    /// Asks for the states of the root, of some folders and of a list of files, and fails the
    /// running test where they differ from git's, or where asking changed something.
    void compareAll();

    /// The states that files of the root have.
    const std::set<FileState::State> &states() const noexcept
    {
        return states_;
    }

  private:
    using Selection = std::function<bool(const std::string &path)>;

    void compareRoot();
    void compareFolder(const std::string &folder);
    void compareFiles();
    void compare(const std::string &asked, const FileStateMap &actual,
                 const Selection &isAsked) const;

    std::vector<std::string> someFolders();
    std::vector<std::string> someFiles();
    upath inRoot(const std::string &path) const;
    std::string describe(const States &found, const States &expected) const;
    std::string describeReport(const std::string &path) const;

    GitRepository repository_;
    Random random_;
    std::string root_;
    std::string status_;
    GitReport report_;
    Blobs blobs_;
    std::unique_ptr<CMAdapter> adapter_;
    std::set<FileState::State> states_;
};

} // namespace vclink::test
