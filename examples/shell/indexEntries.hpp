// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <optional>
#include <string>
#include <vector>

/// What the library does not report about the index: git does.
namespace vclink::shell
{

/// A file of which HEAD and the index have something else.
struct StagedChange
{
    /// relative to the root
    std::string name;
    /// as git writes them, "000000" for none
    std::string modeInHead;
    std::string mode;
    /// of what is staged
    std::string id;
    /// whether nothing is staged yet, as after "git add -N"
    bool isIntended = false;

    bool isAdded() const;
    bool isDeleted() const;
};

struct IndexEntry
{
    std::string name;
    std::string mode;
    std::string id;
    bool isAssumedUnchanged = false;
    /// marked "skip worktree", as what a sparse checkout leaves out
    bool isSkipped = false;
    bool isInConflict = false;

    /// Whether Git was told not to look at the file.
    bool isOverlooked() const;
};

constexpr const char *submoduleMode = "160000";

/// Each file by itself, also one that was renamed; without files in conflict.
/// @return nothing if git can't tell
std::optional<std::vector<StagedChange>> readStagedChanges(const std::filesystem::path &root);

/// @return nothing if git can't tell
std::optional<std::vector<IndexEntry>> readIndex(const std::filesystem::path &root);

} // namespace vclink::shell
