// SPDX-License-Identifier: MIT
#include "fl/i18n/MessageCatalog.hpp"

#include <string_view>

#include "fl/i18n/convert.hpp"
#include "fl/i18n/english_texts.hpp"
#include "fl/i18n/placeholders.hpp"
#include "fl/i18n/translations.hpp"

namespace fl::i18n
{
namespace
{

using resource_core::BaseMsgID;
using resource_core::MsgArgument;

/// "catalogue:key (argument, argument)"
ustring describe(const BaseMsgID &message)
{
    ustring text = utf8_to_ustring(message.getCatalogue() + ':' + message.getKey());
    const char16_t *before = u" (";
    for (const MsgArgument &argument : message.getArguments())
    {
        text += before;
        appendArgument(text, argument);
        before = u", ";
    }
    return message.getArguments().empty() ? text : text + u')';
}

} // namespace

ustring MessageCatalog::get_message(const BaseMsgID &message, const VkLocale &locale)
{
    const bool isKnownCatalogue = std::string_view(message.getCatalogue()) == "shared_vclink:git";
    const EnglishText *const english =
        isKnownCatalogue ? findEnglishText(message.getKey()) : nullptr;
    if (english == nullptr)
    {
        return describe(message);
    }
    const char *const translation = findTranslation(locale, message.getKey(), english->utf8);
    return translation == nullptr
               ? fillPlaceholders(english->utf16, message.getArguments())
               : fillPlaceholders(utf8_to_ustring(translation), message.getArguments());
}

} // namespace fl::i18n
