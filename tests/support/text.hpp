// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <string>
#include <vector>

#include "fl/filesystem/path.hpp"
#include "fl/ustring.hpp"

namespace vclink::test
{

/// Bytes as the host's text and back; nothing is lost either way.
ustring asUtf16(const std::string &bytes);
std::string asUtf8(const ustring &text);

/// Bytes as the host's path and back. A std::filesystem::path serves as well as a text.
upath asPath(const std::string &bytes);
std::string asBytes(const upath &path);
std::vector<upath> asPaths(const std::vector<std::string> &texts);

} // namespace vclink::test
