// SPDX-License-Identifier: MIT
#include "fl/i18n/VkLocale.hpp"

#include <cstdlib>
#include <mutex>
#include <utility>

#include "vclink_host/locale.hpp"

namespace fl::i18n
{
namespace
{

VkLocale readEnvironment()
{
    for (const char *variable : {"LC_ALL", "LC_MESSAGES", "LANG"})
    {
        const char *name = std::getenv(variable);
        if (name != nullptr && *name != '\0')
        {
            return VkLocale(name);
        }
    }
    return VkLocale();
}

struct GlobalLocale
{
    std::mutex mutex;
    VkLocale locale = readEnvironment();
};

GlobalLocale &globalLocale()
{
    static GlobalLocale global;
    return global;
}

} // namespace

VkLocale::VkLocale(std::string name) : name_(std::move(name))
{
}

VkLocale VkLocale::global()
{
    GlobalLocale &global = globalLocale();
    const std::lock_guard<std::mutex> lock(global.mutex);
    return global.locale;
}

const std::string &VkLocale::name() const noexcept
{
    return name_;
}

} // namespace fl::i18n

namespace vclink_host
{

void setGlobalLocale(const fl::i18n::VkLocale &locale)
{
    fl::i18n::GlobalLocale &global = fl::i18n::globalLocale();
    const std::lock_guard<std::mutex> lock(global.mutex);
    global.locale = locale;
}

} // namespace vclink_host
