// SPDX-License-Identifier: MIT
#pragma once

#include <string>

namespace fl::i18n
{

/// The English text of a key of the catalogue "shared_vclink:git", with placeholders as
/// Boost.Format has them; null for a key that the catalogue does not have.
const char *findEnglishText(const std::string &key) noexcept;

} // namespace fl::i18n
