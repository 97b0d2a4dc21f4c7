// SPDX-License-Identifier: MIT
#include "fl/i18n/placeholders.hpp"

#include <algorithm>
#include <cstddef>
#include <string>

#include <boost/variant/get.hpp>

#include "fl/i18n/convert.hpp"

namespace fl::i18n
{
namespace
{

using resource_core::MsgArgument;

bool isPlaceholder(std::u16string_view text)
{
    return text.size() >= 3 && text[1] >= u'1' && text[1] <= u'9' && text[2] == u'%';
}

// Enough space for a path, the most frequent argument of a text.
constexpr std::size_t usualArgument = 64;

} // namespace

void appendArgument(ustring &text, const MsgArgument &argument)
{
    if (const auto *const wide = boost::get<ustring>(&argument))
    {
        text += *wide;
    }
    else if (const auto *const narrow = boost::get<std::string>(&argument))
    {
        text += utf8_to_ustring(*narrow);
    }
    else
    {
        text += utf8_to_ustring(std::to_string(boost::get<long>(argument)));
    }
}

// One pass over a text that a checkout shows for every file: boost::format takes ten times as long.
ustring fillPlaceholders(std::u16string_view text, const std::vector<MsgArgument> &arguments)
{
    ustring filled;
    filled.reserve(text.size() + usualArgument * arguments.size());
    while (!text.empty())
    {
        const auto *const percent = std::find(text.begin(), text.end(), u'%');
        filled.append(text.begin(), percent);
        text.remove_prefix(static_cast<std::size_t>(percent - text.begin()));
        if (isPlaceholder(text))
        {
            const auto number = static_cast<std::size_t>(text[1] - u'1');
            if (number < arguments.size())
            {
                appendArgument(filled, arguments[number]);
            }
            text.remove_prefix(3);
        }
        else if (!text.empty())
        {
            filled += u'%';
            text.remove_prefix(text.substr(0, 2) == u"%%" ? 2 : 1);
        }
    }
    return filled;
}

} // namespace fl::i18n
