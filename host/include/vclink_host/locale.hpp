// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "fl/i18n/VkLocale.hpp"
#include "vclink_host/export.hpp"

namespace vclink_host
{

/// Sets what fl::i18n::VkLocale::global() gives from now on. May be called from any thread.
VCLINK_HOST_EXPORT void setGlobalLocale(const fl::i18n::VkLocale &locale);

/// Sets the folder of the catalogues, UTF-8: FOLDER/LANGUAGE/LC_MESSAGES/vclink_git.mo. At the
/// start it is "share/locale" under the installation. May be called from any thread.
VCLINK_HOST_EXPORT void setCatalogueFolder(const std::string &folder);

} // namespace vclink_host
