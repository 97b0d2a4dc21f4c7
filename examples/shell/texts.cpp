// SPDX-License-Identifier: MIT
#include "texts.hpp"

#include <algorithm>
#include <array>
#include <string_view>
#include <vector>

#include "fl/i18n/VkLocale.hpp"
#include "translations.hpp"
#include "vclink_host/locale.hpp"

namespace vclink::shell
{
namespace
{

std::string languageOf(const std::string &locale)
{
    return locale.substr(0, locale.find_first_of("_.@"));
}

const Translation *find(std::string_view english)
{
    for (const TranslationTable &table : translationTables())
    {
        for (std::size_t index = 0; index < table.size; ++index)
        {
            if (table.rows[index].english == english)
            {
                return table.rows + index;
            }
        }
    }
    return nullptr;
}

} // namespace

void setLanguage(const std::string &locale)
{
    vclink_host::setGlobalLocale(fl::i18n::VkLocale(locale));
}

std::string currentLanguage()
{
    return languageOf(fl::i18n::VkLocale::global().name());
}

bool isLanguage(const std::string &locale)
{
    constexpr std::array<std::string_view, 5> languages{"en", "de", "ja", "C", "POSIX"};
    return std::find(languages.begin(), languages.end(), languageOf(locale)) != languages.end();
}

std::string say(const char *english)
{
    const std::string language = currentLanguage();
    if (language != "de" && language != "ja")
    {
        return english;
    }
    const Translation *const row = find(english);
    if (row == nullptr)
    {
        return english;
    }
    return language == "de" ? row->german : row->japanese;
}

std::string fill(const std::string &text, std::initializer_list<std::string> values)
{
    std::string filled;
    for (std::size_t index = 0; index < text.size(); ++index)
    {
        const bool isPlaceholder = text[index] == '%' && index + 2 < text.size() &&
                                   text[index + 1] >= '1' && text[index + 1] <= '9' &&
                                   text[index + 2] == '%';
        if (!isPlaceholder)
        {
            filled += text[index];
            continue;
        }
        const auto number = static_cast<std::size_t>(text[index + 1] - '1');
        filled += number < values.size() ? values.begin()[number] : std::string();
        index += 2;
    }
    return filled;
}

std::string sayCount(std::size_t count, const char *one, const char *many)
{
    return fill(say(count == 1 ? one : many), {std::to_string(count)});
}

} // namespace vclink::shell
