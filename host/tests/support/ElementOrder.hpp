// SPDX-License-Identifier: MIT
#pragma once

#include <random>
#include <vector>

#include "fl/filesystem/detail/path_text.hpp"
#include "fl/filesystem/path.hpp"

namespace vclink_host_tests
{

/// A path's elements, as the host's own functions yield them.
inline std::vector<ustring> listElements(const ustring &path)
{
    using namespace fl::filesystem::detail;
    std::vector<ustring> elements;
    const unsigned long root = get_root_path_length(path);
    ustring element = extract_first_element(path, root);
    unsigned long position = 0;
    while (!element.empty())
    {
        elements.push_back(element);
        move_down(path, root, position, element);
    }
    return elements;
}

/// Short paths of few letters, so that they often share parts; with leading, doubled and trailing
/// slashes, characters on both sides of the slash, a surrogate and a unit above the surrogates.
inline std::vector<ustring> makeRandomPaths(unsigned seed, std::size_t count)
{
    std::mt19937 random(seed);
    const ustring alphabet = u"//-.0ab\U0001F600\uFF01";
    std::uniform_int_distribution<std::size_t> length(0, 12);
    std::uniform_int_distribution<std::size_t> letter(0, alphabet.size() - 1);
    const ustring prefixes[] = {u"", u"/", u"a/b", u"/home/user/working copy/dir"};
    std::uniform_int_distribution<std::size_t> prefix(0, std::size(prefixes) - 1);
    std::vector<ustring> paths;
    for (std::size_t index = 0; index < count; ++index)
    {
        ustring path = prefixes[prefix(random)];
        for (std::size_t left = length(random); left > 0; --left)
        {
            path += alphabet[letter(random)];
        }
        paths.push_back(path);
    }
    return paths;
}

} // namespace vclink_host_tests
