// SPDX-License-Identifier: MIT
#include "foundation/core/except/IMsgIDException.hpp"

#include "fl/i18n/MessageCatalog.hpp"
#include "fl/i18n/VkLocale.hpp"

namespace foundation::core::except
{

IMsgIDException::~IMsgIDException() noexcept = default;

std::string IMsgIDException::get_error_id(const resource_core::BaseMsgID &message)
{
    return message.getCatalogue() + ':' + message.getKey();
}

ustring IMsgIDException::GetUnicodeMessageTxt() const
{
    return fl::i18n::MessageCatalog::get_message(GetBaseMsgIDObj(), fl::i18n::VkLocale::global());
}

} // namespace foundation::core::except
