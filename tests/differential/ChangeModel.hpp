// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <string>
#include <vector>

#include "GitReport.hpp"
#include "expectedStates.hpp"
#include "support/GitRepository.hpp"
#include "vclink/FileState.hpp"

namespace vclink::test
{

using Names = std::vector<std::string>;

/// What the library owes for each change of a working copy, carried out with the git command line.
/// git's report decides whether a change is refused, and which paths a list means; git then makes
/// the change to exactly these. These are the rules in which the result differs from what git does
/// with the same list:
///
/// - Whether a file is added, removed or reverted goes by its state; see expectedStates().
/// - A file that was moved as it is goes by its old name. The new one stays when it is removed.
/// - A name means the file and all below it, or, if it has to be escaped, the file alone. A
/// symbolic link means its target, also if a folder was listed and the link found in it; see
/// listedNames.hpp.
/// - Ignored files and names of nothing are passed over where git refuses them.
/// - A commit takes files in conflict as they stand.
///
/// Each change gives the refusal that it ends with, which is empty for a success: the message's key
/// and, after a line feed, the files that it reports, a line each.
class ChangeModel
{
  public:
    explicit ChangeModel(GitRepository repository);

    std::string add(const Names &names);
    std::string remove(const Names &names);
    std::string revert(const Names &names);
    std::string markResolved(const std::string &name);
    std::string commit(const std::string &message);

    /// Asks git again.
    void refresh();
    /// As refresh(), where nothing but the working tree has changed.
    void refreshStatus();
    /// The result of the last question to git.
    const std::string &status() const noexcept
    {
        return status_;
    }
    const std::string &index() const noexcept
    {
        return index_;
    }
    const GitReport &report() const noexcept
    {
        return report_;
    }
    /// The states that the library owes for the whole working copy.
    States states();

  private:
    States statesOf(const Names &names);
    States statesWhere(const std::function<bool(const std::string &path)> &isAsked);
    std::string refuse(const std::string &key, const Names &paths) const;
    /// The paths of the report that the names mean and that `isWanted` takes.
    Names meantBy(const Names &names,
                  const std::function<bool(const GitFile &file)> &isWanted) const;
    /// Runs git with the paths as its input.
    void run(const std::vector<std::string> &arguments, const Names &paths) const;
    void stage(const Names &paths) const;
    void unstage(const Names &paths) const;

    GitRepository repository_;
    std::string status_;
    std::string index_;
    GitReport report_;
    Blobs blobs_;
};

} // namespace vclink::test
