// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "fl/i18n/VkLocale.hpp"

namespace fl::i18n
{

/// Returns the translation of a message into the locale's language, UTF-8, or null if there is none
/// or the language's catalogue cannot be read. The text lives as long as the process, because
/// catalogues are never released. Throws only std::bad_alloc. Any thread.
const char *findTranslation(const VkLocale &locale, const std::string &key, const char *english);

} // namespace fl::i18n
