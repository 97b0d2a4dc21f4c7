// SPDX-License-Identifier: MIT
#include <set>

#include <boost/variant/get.hpp>
#include <gtest/gtest.h>

#include "fl/i18n/MessageCatalog.hpp"
#include "fl/i18n/convert.hpp"
#include "support/Keys.hpp"

using fl::i18n::MessageCatalog;
using fl::i18n::VkLocale;
using resource_core::BaseMsgID;
using vclink_host_tests::makeAllMessages;

namespace
{

std::string toText(const resource_core::MsgArgument &argument)
{
    if (const long *number = boost::get<long>(&argument))
    {
        return std::to_string(*number);
    }
    if (const std::string *text = boost::get<std::string>(&argument))
    {
        return *text;
    }
    return fl::i18n::to_string(boost::get<ustring>(argument));
}

} // namespace

TEST(Catalogue, HasATextForEachKey)
{
    std::set<ustring> texts;
    for (const BaseMsgID &message : makeAllMessages())
    {
        const ustring text = MessageCatalog::get_message(message, VkLocale::global());
        EXPECT_FALSE(text.empty()) << message.getKey();
        EXPECT_TRUE(texts.insert(text).second) << message.getKey();
    }
}

TEST(Catalogue, ShowsEveryArgumentInTheText)
{
    for (const BaseMsgID &message : makeAllMessages())
    {
        const ustring text = MessageCatalog::get_message(message, VkLocale::global());
        for (const auto &argument : message.getArguments())
        {
            EXPECT_NE(fl::i18n::to_string(text).find(toText(argument)), std::string::npos)
                << message.getKey();
        }
    }
}

TEST(Catalogue, LeavesWhatLooksLikeAPlaceholderInAnArgument)
{
    const BaseMsgID message({ustring(u"100%/%1%/%s")}, vclink_host_tests::catalogue,
                            "ProgressCallbackCheckoutMessage");
    const ustring text = MessageCatalog::get_message(message, VkLocale::global());
    EXPECT_NE(text.find(u"100%/%1%/%s"), ustring::npos) << fl::i18n::to_string(text);
}
