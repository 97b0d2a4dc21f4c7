// SPDX-License-Identifier: MIT
#pragma once

#include "fl/i18n/VkLocale.hpp"
#include "fl/ustring.hpp"
#include "resource_core/BaseMsgID.hpp"
#include "vclink_host/export.hpp"

namespace fl::i18n
{

/// The texts behind message identifiers.
class VCLINK_HOST_EXPORT MessageCatalog
{
  public:
    /// The text of `message` in `locale`, its arguments filled in. The text is looked up and built
    /// at each call. A catalogue or key that is not known gives the identifier's own words: the
    /// catalogue, the key and the arguments. Raises std::bad_alloc only. Any thread.
    static ustring get_message(const resource_core::BaseMsgID &message, const VkLocale &locale);
};

} // namespace fl::i18n
