// SPDX-License-Identifier: MIT
#pragma once

#include "fl/i18n/MessageCatalog.hpp"
#include "fl/i18n/VkLocale.hpp"

namespace vclink::test
{

/// The text of the message in the current locale.
inline ustring catalogueText(const resource_core::BaseMsgID &message)
{
    return fl::i18n::MessageCatalog::get_message(message, fl::i18n::VkLocale::global());
}

} // namespace vclink::test
