// SPDX-License-Identifier: MIT
#include "fl/i18n/placeholders.hpp"

#include <cstddef>

namespace fl::i18n
{
namespace
{

bool isPlaceholder(std::string_view text)
{
    return text.size() >= 3 && text[1] >= '1' && text[1] <= '9' && text[2] == '%';
}

} // namespace

// One pass over a text that is shown for every file of a checkout: boost::format takes ten times as
// long.
std::string fillPlaceholders(std::string_view text, const std::vector<std::string> &arguments)
{
    std::string filled;
    std::size_t size = text.size();
    for (const std::string &argument : arguments)
    {
        size += argument.size();
    }
    filled.reserve(size);
    for (std::size_t percent = text.find('%'); percent != std::string_view::npos;
         percent = text.find('%'))
    {
        filled += text.substr(0, percent);
        text.remove_prefix(percent);
        if (isPlaceholder(text))
        {
            const auto number = static_cast<std::size_t>(text[1] - '1');
            filled += number < arguments.size() ? arguments[number] : std::string();
            text.remove_prefix(3);
        }
        else
        {
            filled += '%';
            text.remove_prefix(text.substr(0, 2) == "%%" ? 2 : 1);
        }
    }
    filled += text;
    return filled;
}

} // namespace fl::i18n
