// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "fl/i18n/VkLocale.hpp"

namespace fl::i18n
{

/// The translation of a message into the locale's language, UTF-8; null where there is none, also
/// when the language's catalogue can't be read. Raises std::bad_alloc only. Any thread. What it
/// gives stays as long as the process: catalogues are never given up.
const char *findTranslation(const VkLocale &locale, const std::string &key, const char *english);

} // namespace fl::i18n
