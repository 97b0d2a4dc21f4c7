// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <string_view>

namespace fl::i18n
{

/// A text in both encodings, since most texts are shown as they are.
struct EnglishText
{
    const char *utf8;
    std::u16string_view utf16;
};

/// The English text of a key of the catalogue "shared_vclink:git", with placeholders as
/// Boost.Format has them; null for a key that the catalogue does not have.
const EnglishText *findEnglishText(const std::string &key) noexcept;

} // namespace fl::i18n
