// SPDX-License-Identifier: MIT
#pragma once

#include <map>
#include <string>
#include <vector>

#include "support/GitRepository.hpp"

namespace vclink::test
{

/// The mode of a side that there is not.
inline const std::string noMode = "000000";

/// What the git command line says of one path. The letters are those of its status: '.' for
/// unchanged, M, T, A, D.
struct GitFile
{
    /// the index against HEAD
    char index = '.';
    /// the working tree against the index
    char workTree = '.';
    bool unmerged = false;
    /// reported as untracked, which a path gone from the index may be as well
    bool untracked = false;
    std::string headMode = noMode;
    std::string headId;
    std::string indexMode = noMode;
    std::string indexId;
    std::string workTreeMode = noMode;
    /// whether the working tree has more than an empty file there
    bool hasBytes = false;
};

using GitReport = std::map<std::string, GitFile>;

/// What `git status` says, all paths being listed one by one, and nothing as renamed.
std::string runGitStatus(const GitRepository &repository);

/// What `git ls-files` says of the index, stages and all.
std::string listIndex(const GitRepository &repository);

/// The paths of a status, and those that the index lists besides, which are unchanged.
GitReport readGitReport(const GitRepository &repository, const std::string &status,
                        const std::string &index);
GitReport readGitReport(const GitRepository &repository, const std::string &status);

/// Contents by ids.
using Blobs = std::map<std::string, std::string>;

/// The contents of these blobs; what is no blob is left out.
Blobs readBlobs(const GitRepository &repository, const std::vector<std::string> &ids);

} // namespace vclink::test
