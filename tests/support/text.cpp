// SPDX-License-Identifier: MIT
#include "support/text.hpp"

#include "fl/i18n/convert.hpp"

namespace vclink::test
{

ustring asUtf16(const std::string &bytes)
{
    return fl::i18n::utf8_to_ustring(bytes);
}

std::string asUtf8(const ustring &text)
{
    return fl::i18n::ustring_to_utf8(text);
}

upath asPath(const std::string &bytes)
{
    return upath(asUtf16(bytes));
}

std::string asBytes(const upath &path)
{
    return asUtf8(path.string());
}

std::vector<upath> asPaths(const std::vector<std::string> &texts)
{
    std::vector<upath> paths;
    paths.reserve(texts.size());
    for (const auto &text : texts)
        paths.push_back(asPath(text));
    return paths;
}

} // namespace vclink::test
