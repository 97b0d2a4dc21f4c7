// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

namespace vclink::test
{

/// Text as a C string literal shows it, all bytes outside ASCII as octal numbers. fast-import takes
/// paths in this form, and people can read it.
std::string quote(const std::string &text);

/// A value as one of Git's configuration files holds it.
std::string quoteConfigValue(const std::string &value);

/// A content, or a message of a commit, as fast-import reads it.
std::string asFastImportData(const std::string &bytes);

/// Paths as commands of git read them with "-z".
std::string joinWithNul(const std::vector<std::string> &paths);

} // namespace vclink::test
