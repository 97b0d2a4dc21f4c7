// SPDX-License-Identifier: MIT
#include "fl/i18n/MessageCatalog.hpp"

#include <boost/variant/apply_visitor.hpp>
#include <boost/variant/static_visitor.hpp>

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

/// An argument as UTF-8. What is not valid UTF-8 in it stays as it is.
struct ToUtf8 : boost::static_visitor<std::string>
{
    std::string operator()(long number) const
    {
        return std::to_string(number);
    }
    std::string operator()(const std::string &text) const
    {
        return text;
    }
    std::string operator()(const ustring &text) const
    {
        return ustring_to_utf8(text);
    }
};

std::vector<std::string> toUtf8(const std::vector<MsgArgument> &arguments)
{
    std::vector<std::string> texts;
    texts.reserve(arguments.size());
    for (const MsgArgument &argument : arguments)
    {
        texts.push_back(boost::apply_visitor(ToUtf8(), argument));
    }
    return texts;
}

/// "catalogue:key (argument, argument)"
std::string describe(const BaseMsgID &message)
{
    std::string text = message.getCatalogue() + ':' + message.getKey();
    const char *before = " (";
    for (const MsgArgument &argument : message.getArguments())
    {
        text += before + boost::apply_visitor(ToUtf8(), argument);
        before = ", ";
    }
    return message.getArguments().empty() ? text : text + ')';
}

} // namespace

ustring MessageCatalog::get_message(const BaseMsgID &message, const VkLocale &locale)
{
    const bool isKnownCatalogue = message.getCatalogue() == "shared_vclink:git";
    const char *const english = isKnownCatalogue ? findEnglishText(message.getKey()) : nullptr;
    if (english == nullptr)
    {
        return utf8_to_ustring(describe(message));
    }
    const std::string text = translate(locale, message.getKey(), english);
    return utf8_to_ustring(fillPlaceholders(text, toUtf8(message.getArguments())));
}

} // namespace fl::i18n
