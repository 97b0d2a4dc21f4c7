// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "fl/i18n/VkLocale.hpp"
#include "vclink_host/export.hpp"

namespace vclink_host
{

/// Sets the result of fl::i18n::VkLocale::global(). Can be called from any thread.
VCLINK_HOST_EXPORT void setGlobalLocale(const fl::i18n::VkLocale &locale);

/// Sets the folder of the catalogues, UTF-8: FOLDER/LANGUAGE/LC_MESSAGES/vclink_git.mo. By default
/// it is "share/locale" in the installation folder. Can be called from any thread.
VCLINK_HOST_EXPORT void setCatalogueFolder(const std::string &folder);

} // namespace vclink_host
