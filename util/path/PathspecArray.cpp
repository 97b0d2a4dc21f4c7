// SPDX-License-Identifier: MIT
#include "util/path/PathspecArray.hpp"

#include <algorithm>
#include <iterator>
#include <utility>

#include "error/errorUtil/gitString.hpp"
#include "fl/i18n/convert.hpp"
#include "util/path/paths.hpp"
#include "util/path/pathspecEscape.hpp"

namespace vclink::git
{
namespace
{

/// Matches nothing in any call of libgit2. An empty entry, "." and "/" (a file whose name is one
/// backslash) match everything in some calls.
constexpr const char *matchesNothing = "..";

std::string filePattern(const std::string &relative)
{
    const bool meansEverything = relative.empty() || relative == "." || relative == "/";
    return meansEverything ? matchesNothing : escapePathspec(relative);
}

std::string folderPattern(const std::string &relative)
{
    if (relative == ".")
    {
        return "*";
    }
    return filePattern(relative) + "/*";
}

} // namespace

PathspecArray::PathspecArray(std::vector<std::string> strings)
    : strings_(std::move(strings)), array_{nullptr, 0}
{
    pointers_.reserve(strings_.size());
    std::transform(strings_.begin(), strings_.end(), std::back_inserter(pointers_),
                   [](std::string &text)
                   {
                       refuseNul(text);
                       return text.data();
                   });
    if (!pointers_.empty())
    {
        array_ = {pointers_.data(), pointers_.size()};
    }
}

const git_strarray *getArrayPointer(const PathspecArray &pathspec) noexcept
{
    return &pathspec.array();
}

git_strarray getArray(const PathspecArray &pathspec) noexcept
{
    return pathspec.array();
}

PathspecArray makeFilePathspec(const std::vector<upath> &files, const upath &root)
{
    std::vector<std::string> patterns;
    if (!files.empty())
    {
        RootRelativePaths paths(root);
        patterns.reserve(files.size());
        std::transform(files.begin(), files.end(), std::back_inserter(patterns),
                       [&paths](const upath &file) { return filePattern(paths.relative(file)); });
    }
    return PathspecArray(std::move(patterns));
}

PathspecArray makeStringPathspec(const std::vector<ustring> &texts)
{
    std::vector<std::string> strings;
    strings.reserve(texts.size());
    std::transform(texts.begin(), texts.end(), std::back_inserter(strings),
                   fl::i18n::ustring_to_utf8);
    return PathspecArray(std::move(strings));
}

PathspecArray makeFolderPathspec(const upath &folder, const upath &root)
{
    return PathspecArray({folderPattern(RootRelativePaths(root).relative(folder))});
}

} // namespace vclink::git
