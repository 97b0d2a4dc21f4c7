// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "fl/i18n/VkLocale.hpp"
#include "vclink_host/locale.hpp"

namespace vclink::test
{

/// Sets the process's locale for the life of the object.
class LocaleOfTheProcess
{
  public:
    explicit LocaleOfTheProcess(const std::string &name)
    {
        vclink_host::setGlobalLocale(fl::i18n::VkLocale(name));
    }
    LocaleOfTheProcess(const LocaleOfTheProcess &) = delete;
    LocaleOfTheProcess &operator=(const LocaleOfTheProcess &) = delete;
    ~LocaleOfTheProcess()
    {
        vclink_host::setGlobalLocale(before_);
    }

  private:
    fl::i18n::VkLocale before_ = fl::i18n::VkLocale::global();
};

} // namespace vclink::test
