// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <string_view>

namespace fl::i18n
{

/// A text in both encodings, because most texts are shown unchanged.
struct EnglishText
{
    const char *utf8;
    std::u16string_view utf16;
};

/// Returns the English text of a key of the catalogue "shared_vclink:git", with placeholders of
/// Boost.Format, or null for an unknown key.
const EnglishText *findEnglishText(const std::string &key) noexcept;

} // namespace fl::i18n
