// SPDX-License-Identifier: MIT
#include "fl/i18n/MessageCatalog.hpp"

#include <boost/format.hpp>
#include <boost/variant/apply_visitor.hpp>
#include <boost/variant/static_visitor.hpp>

#include "fl/i18n/convert.hpp"
#include "fl/i18n/english_texts.hpp"
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

/// Fills the placeholders. Whatever a translator made of them, nothing is raised: a placeholder
/// without an argument becomes empty, an argument without a placeholder is left out.
std::string fill(const std::string &text, const std::vector<MsgArgument> &arguments)
{
    boost::format format;
    format.exceptions(boost::io::no_error_bits);
    format.parse(text);
    for (const MsgArgument &argument : arguments)
    {
        format % boost::apply_visitor(ToUtf8(), argument);
    }
    return format.str();
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
    return utf8_to_ustring(fill(text, message.getArguments()));
}

} // namespace fl::i18n
