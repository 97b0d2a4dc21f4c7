// SPDX-License-Identifier: MIT
// The order of paths in maps and reports: a strict weak order that agrees with the order of the
// paths' elements. Input: three paths, a line each.
#include <array>
#include <utility>

#include "check.hpp"
#include "fl/filesystem/detail/path_text.hpp"
#include "fl/filesystem/path.hpp"
#include "fl/i18n/convert.hpp"
#include "vclink/FileStateMap.hpp"

using vclink::fuzz::require;

namespace
{

using Elements = std::vector<ustring>;

/// As the host's own functions yield them.
Elements listElements(const ustring &path)
{
    using namespace fl::filesystem::detail;
    Elements elements;
    const unsigned long root = get_root_path_length(path);
    ustring element = extract_first_element(path, root);
    for (unsigned long position = 0; !element.empty(); move_down(path, root, position, element))
    {
        require(elements.size() <= path.size(), "a walk over a path's elements ends");
        elements.push_back(element);
    }
    return elements;
}

Elements splitPlainly(const ustring &path)
{
    Elements elements;
    if (!path.empty() && path.front() == u'/')
        elements.push_back(u"/");
    ustring name;
    for (const char16_t unit : path + u"/")
    {
        if (unit != u'/')
            name += unit;
        else if (!name.empty())
            elements.push_back(std::exchange(name, {}));
    }
    return elements;
}

bool isLess(const upath &left, const upath &right)
{
    return vclink::FileStateMap::key_compare()(left, right);
}

bool isEquivalent(const upath &left, const upath &right)
{
    return !isLess(left, right) && !isLess(right, left);
}

void checkOrder(const upath &a, const upath &b, const upath &c)
{
    require(!(isLess(a, b) && isLess(b, a)), "the order is asymmetric");
    require(!(isLess(a, b) && isLess(b, c)) || isLess(a, c), "the order is transitive");
    require(!(isEquivalent(a, b) && isEquivalent(b, c)) || isEquivalent(a, c),
            "equivalence is transitive");
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t *data, std::size_t size)
{
    std::array<upath, 3> paths;
    std::array<Elements, 3> elements;
    const auto lines = vclink::fuzz::cut(vclink::fuzz::bytesOf(data, size), '\n', paths.size());
    for (std::size_t i = 0; i < paths.size(); ++i)
    {
        const ustring text = fl::i18n::utf8_to_ustring(lines[i]);
        // Whether a path is in native form plays no part in its order.
        paths[i] = upath(text, i != 1);
        elements[i] = splitPlainly(text);
        require(listElements(text) == elements[i], "a path is walked element by element");
        require(!isLess(paths[i], paths[i]), "the order is irreflexive");
    }
    for (std::size_t a = 0; a < paths.size(); ++a)
    {
        for (std::size_t b = 0; b < paths.size(); ++b)
        {
            require(isLess(paths[a], paths[b]) == (elements[a] < elements[b]),
                    "the order is that of the elements");
            for (const auto &c : paths)
                checkOrder(paths[a], paths[b], c);
        }
    }
    return 0;
}
