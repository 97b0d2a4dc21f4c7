// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "vclink_host/export.hpp"

namespace fl::i18n
{

/// Names the language of texts: a POSIX locale name such as "de_DE.UTF-8" or "ja". "C", "POSIX", an
/// empty name and a language without a catalogue all mean English. Only language and country count;
/// texts are always in UTF-8.
class VCLINK_HOST_EXPORT VkLocale
{
  public:
    VkLocale() = default;
    explicit VkLocale(std::string name);

    /// Returns the current locale of the process; vclink_host/locale.hpp sets it. By default it is
    /// that of "LC_ALL", "LC_MESSAGES" or "LANG", the first that is set and not empty. May be
    /// called from any thread. The reference stays valid, and keeps this name, until the process
    /// ends.
    static const VkLocale &global();

    const std::string &name() const noexcept;

  private:
    std::string name_;
};

} // namespace fl::i18n
