// SPDX-License-Identifier: MIT
#include "listedNames.hpp"

#include <algorithm>

namespace vclink::test
{

namespace fs = std::filesystem;

bool isBelow(const std::string &path, const std::string &folder)
{
    return path.compare(0, folder.size() + 1, folder + '/') == 0;
}

bool isEscaped(const std::string &name)
{
    static const std::string whiteSpace = " \t\r\n\v\f";
    return name.front() == '#' || name.front() == '!' ||
           whiteSpace.find(name.back()) != std::string::npos ||
           name.find_first_of("\n\v\f") != std::string::npos;
}

bool isMeant(const std::string &path, const std::string &name)
{
    return path == name || (!isEscaped(name) && isBelow(path, name));
}

bool isMeant(const std::string &path, const std::vector<std::string> &names)
{
    return std::any_of(names.begin(), names.end(),
                       [&path](const std::string &name) { return isMeant(path, name); });
}

std::vector<std::string> resolveNames(const fs::path &root, const std::vector<std::string> &names)
{
    const fs::path canonicalRoot = fs::canonical(root);
    std::vector<std::string> resolved;
    for (const auto &name : names)
    {
        const fs::path path = fs::weakly_canonical(root / name).lexically_relative(canonicalRoot);
        if (path != "." && *path.begin() != "..")
        {
            resolved.push_back(path.string());
        }
    }
    return resolved;
}

bool isNoPattern(const std::string &name)
{
    return name.find_first_of("*?[\\") == std::string::npos && name.back() != '/';
}

bool isPlain(const fs::path &root, const std::string &name)
{
    if (!isNoPattern(name))
    {
        return false;
    }
    for (fs::path part = name; !part.empty(); part = part.parent_path())
    {
        std::error_code missing;
        if (fs::is_symlink(fs::symlink_status(root / part, missing)))
        {
            return false;
        }
    }
    return true;
}

} // namespace vclink::test
