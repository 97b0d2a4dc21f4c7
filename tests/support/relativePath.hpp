// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include <boost/filesystem/operations.hpp>
#include <boost/filesystem/path.hpp>

namespace vclink::test
{

/// boost::filesystem::relative of Boost 1.74. Later releases keep a separator at the end, and look
/// for a missing relative path in the working folder.
/// @throws boost::filesystem::filesystem_error
inline std::string relativeOfBoost174(const std::string &path, const std::string &root)
{
    namespace fs = boost::filesystem;
    boost::system::error_code ignored;
    const auto canonical = [&ignored](const fs::path &name)
    {
        // A name that is too long is not known to be missing.
        const bool isMissing =
            name.is_relative() &&
            (name.empty() || fs::status(*name.begin(), ignored).type() == fs::file_not_found);
        return isMissing ? name.lexically_normal() : fs::weakly_canonical(name);
    };
    std::string text = canonical(path).lexically_relative(canonical(root)).string();
    if (text.size() > 1 && text.back() == '/')
    {
        text.pop_back();
        text += fs::exists(path, ignored) ? "" : "/.";
    }
    return text;
}

} // namespace vclink::test
