// SPDX-License-Identifier: MIT
#include "fl/filesystem/operations.hpp"

#include <string>

#include <boost/filesystem/operations.hpp>

#include "fl/i18n/convert.hpp"

namespace fl::filesystem
{
namespace
{

/// Returns the name for the system's calls, empty if no file can have this name.
std::string toNativeName(const upath &path)
{
    std::string name = fl::i18n::ustring_to_utf8(path.string());
    if (name.find('\0') != std::string::npos)
    {
        name.clear();
    }
    return name;
}

} // namespace

bool exists(const upath &path)
{
    return boost::filesystem::exists(toNativeName(path));
}

bool remove(const upath &path)
{
    return boost::filesystem::remove(toNativeName(path));
}

} // namespace fl::filesystem
