// SPDX-License-Identifier: MIT
#include "fl/i18n/VkLocale.hpp"
#include "vclink_host/locale.hpp"

void speakGerman()
{
    vclink_host::setGlobalLocale(fl::i18n::VkLocale("de"));
}
