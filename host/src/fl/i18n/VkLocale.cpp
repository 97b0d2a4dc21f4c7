// SPDX-License-Identifier: MIT
#include "fl/i18n/VkLocale.hpp"

#include <algorithm>
#include <atomic>
#include <cstdlib>
#include <forward_list>
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

/// The global locale is read for each text, and seldom set. So that readers need no lock, a locale
/// that was global once is kept, and is found when it is set again.
class GlobalLocale
{
  public:
    const VkLocale &get() const noexcept
    {
        return *current_.load(std::memory_order_acquire);
    }

    void set(const VkLocale &locale)
    {
        const std::lock_guard<std::mutex> lock(mutex_);
        const auto known =
            std::find_if(locales_.begin(), locales_.end(),
                         [&locale](const VkLocale &each) { return each.name() == locale.name(); });
        if (known == locales_.end())
        {
            locales_.push_front(locale);
        }
        current_.store(known == locales_.end() ? &locales_.front() : &*known,
                       std::memory_order_release);
    }

  private:
    std::mutex mutex_;
    std::forward_list<VkLocale> locales_{readEnvironment()};
    std::atomic<const VkLocale *> current_{&locales_.front()};
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

const VkLocale &VkLocale::global()
{
    return globalLocale().get();
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
    fl::i18n::globalLocale().set(locale);
}

} // namespace vclink_host
