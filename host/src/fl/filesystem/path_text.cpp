// SPDX-License-Identifier: MIT
#include "fl/filesystem/detail/path_text.hpp"

#include <algorithm>

namespace fl::filesystem::detail
{
namespace
{

constexpr char16_t separator = u'/';

/// Returns the end of the name that begins at `begin`.
std::size_t findEndOfName(const ustring &path, std::size_t begin)
{
    return std::min(path.find(separator, begin), path.size());
}

/// Returns the position of the last element in the path, empty for a path without a name.
struct NameRange
{
    std::size_t begin;
    std::size_t end;
};

NameRange findLastName(const ustring &path)
{
    const std::size_t last = path.find_last_not_of(separator);
    if (last == ustring::npos)
    {
        return {path.size(), path.size()};
    }
    const std::size_t before = path.rfind(separator, last);
    return {before == ustring::npos ? 0 : before + 1, last + 1};
}

/// Returns the start of the extension of a name, or its end if it has none.
std::size_t findExtension(const ustring &path, NameRange name)
{
    const std::size_t dot = path.rfind(u'.', name.end - 1);
    const bool isDotDot = path.compare(name.begin, name.end - name.begin, u"..") == 0;
    return dot == ustring::npos || dot <= name.begin || isDotDot ? name.end : dot;
}

} // namespace

unsigned long get_root_path_length(const ustring &path)
{
    return std::min(path.find_first_not_of(separator), path.size());
}

ustring extract_first_element(const ustring &path, unsigned long root_length)
{
    return root_length > 0 ? ustring(1, separator) : path.substr(0, findEndOfName(path, 0));
}

void move_down(const ustring &path, unsigned long root_length, unsigned long &position,
               ustring &element)
{
    const std::size_t end = position < root_length ? root_length : findEndOfName(path, position);
    position = std::min(path.find_first_not_of(separator, end), path.size());
    element.assign(path, position, findEndOfName(path, position) - position);
}

void concatenate_pathname(ustring &path, const ustring &name, bool /*native*/)
{
    if (path.empty() || name.empty())
    {
        path += name;
        return;
    }
    const bool pathBringsOne = path.back() == separator;
    const bool nameBringsOne = name.front() == separator;
    if (!pathBringsOne && !nameBringsOne)
    {
        path += separator;
    }
    path.append(name, pathBringsOne && nameBringsOne ? 1 : 0, ustring::npos);
}

void replace_extension(ustring &path, const ustring &extension)
{
    const NameRange name = findLastName(path);
    if (name.begin == name.end)
    {
        return;
    }
    const std::size_t old = findExtension(path, name);
    ustring replacement = extension;
    if (!replacement.empty() && replacement.front() != u'.')
    {
        replacement.insert(replacement.begin(), u'.');
    }
    path.replace(old, name.end - old, replacement);
}

ustring make_generic_form(const ustring &path)
{
    return path;
}

ustring make_native_form(const ustring &path, bool /*native*/)
{
    return path;
}

ustring make_native_access_form(const ustring &path)
{
    return path;
}

} // namespace fl::filesystem::detail
