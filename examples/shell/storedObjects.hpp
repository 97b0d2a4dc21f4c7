// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <stdexcept>
#include <string>
#include <vector>

#include "indexEntries.hpp"

/// Puts things into a repository's store of objects.
namespace vclink::shell
{

/// What can't be stored, and why.
class StoreFailure : public std::runtime_error
{
  public:
    using std::runtime_error::runtime_error;
};

/// A tar archive of files as they are on the disk, byte for byte: git would store and restore their
/// content through the filters that the attributes name.
/// @param names relative to the root; a folder's files are named by themselves
/// @return the id of a blob
/// @throws StoreFailure
std::string storeArchive(const std::filesystem::path &root, const std::vector<std::string> &names);

/// @return the id of a tree with the blobs that are staged for these files
/// @throws StoreFailure
std::string storeTree(const std::filesystem::path &root, const std::vector<StagedChange> &files);

enum class Filters
{
    Applied,
    Ignored
};

/// The files whose content on the disk differs from their blobs.
std::vector<StagedChange> selectOthersThanOnDisk(const std::filesystem::path &root,
                                                 const std::vector<StagedChange> &files,
                                                 Filters filters);

} // namespace vclink::shell
