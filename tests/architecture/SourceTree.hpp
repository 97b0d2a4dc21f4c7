// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <map>
#include <string>
#include <vector>

namespace vclink::test
{

/// The sources of a repository: path from the root, with slashes, to content.
using SourceTree = std::map<std::string, std::string>;

/// Reads the C and C++ files of these folders of `root`; a folder that is missing has none.
SourceTree readSourceTree(const std::filesystem::path &root,
                          const std::vector<std::string> &folders);

/// What a file includes, as written, in order.
std::vector<std::string> findIncludes(const std::string &content);

/// The file of the tree that `file` gets when it includes `name`, or an empty text when it is none
/// of the tree's.
std::string resolveInclude(const SourceTree &tree, const std::string &file,
                           const std::string &name);

/// The first folder of a path from the root: the layer that the file belongs to.
std::string layerOf(const std::string &file);

/// Whether the file is a header.
bool isHeader(const std::string &file);

} // namespace vclink::test
