// SPDX-License-Identifier: MIT
#pragma once

#include "fl/i18n/VkLocale.hpp"
#include "fl/ustring.hpp"
#include "resource_core/BaseMsgID.hpp"
#include "vclink_host/export.hpp"

namespace fl::i18n
{

/// Returns the texts of message identifiers.
class VCLINK_HOST_EXPORT MessageCatalog
{
  public:
    /// Returns the text of `message` in `locale`, with its arguments. Looks up and builds the text
    /// at each call. For an unknown catalogue or key, returns the catalogue, the key and the
    /// arguments. Throws only std::bad_alloc. Any thread.
    static ustring get_message(const resource_core::BaseMsgID &message, const VkLocale &locale);
};

} // namespace fl::i18n
