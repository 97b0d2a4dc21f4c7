// SPDX-License-Identifier: MIT
#include "fl/i18n/translations.hpp"

#include <algorithm>
#include <locale>
#include <map>
#include <mutex>
#include <new>
#include <tuple>

#include <boost/locale/gnu_gettext.hpp>

#include "fl/filesystem/detail/path_text.hpp"
#include "fl/filesystem/operations.hpp"
#include "fl/i18n/convert.hpp"
#include "vclink_host/locale.hpp"

namespace fl::i18n
{
namespace
{

const char *const domain = "vclink_git";

struct Language
{
    std::string language;
    std::string country;
};

/// Allows only letters and digits, because the words become parts of a file name.
bool isPlainWord(const std::string &word)
{
    return std::all_of(word.begin(), word.end(),
                       [](char letter)
                       {
                           return (letter >= 'a' && letter <= 'z') ||
                                  (letter >= 'A' && letter <= 'Z') ||
                                  (letter >= '0' && letter <= '9');
                       });
}

/// Splits "de_DE.UTF-8@euro" into "de" and "DE". Both are empty for a name of another form.
Language parseLocaleName(const std::string &name)
{
    const std::string place = name.substr(0, name.find_first_of(".@"));
    const std::size_t underscore = place.find('_');
    Language result;
    result.language = place.substr(0, underscore);
    result.country = underscore == std::string::npos ? "" : place.substr(underscore + 1);
    return isPlainWord(result.language) && isPlainWord(result.country) ? result : Language();
}

std::string getInstalledCatalogues()
{
    ustring folder = fl::filesystem::get_install_path();
    fl::filesystem::detail::concatenate_pathname(folder, u"share/locale", true);
    return ustring_to_utf8(folder);
}

/// Returns true if a locale has no translations because of its name.
bool isUntranslated(const std::string &name)
{
    const bool isC = name[0] == 'C' && (name.size() == 1 || name[1] == '.');
    return isC || name.empty() || name == "POSIX";
}

using Messages = boost::locale::message_format<char>;

/// Returns a locale object that owns the language's catalogue, or the classic one if the file is
/// broken.
std::locale loadCatalogue(const std::string &folder, const Language &language)
{
    boost::locale::gnu_gettext::messages_info info;
    info.language = language.language;
    info.country = language.country;
    info.encoding = "UTF-8";
    info.domains.emplace_back(domain);
    info.paths.push_back(folder);
    try
    {
        return std::locale(std::locale::classic(),
                           boost::locale::gnu_gettext::create_messages_facet<char>(info));
    }
    catch (const std::bad_alloc &)
    {
        throw;
    }
    catch (const std::exception &)
    {
        return std::locale::classic();
    }
}

/// The catalogues that were requested. None is read twice.
class Catalogues
{
  public:
    void setFolder(const std::string &folder)
    {
        const std::lock_guard<std::mutex> lock(mutex_);
        folder_ = folder;
    }

    std::locale get(const Language &language)
    {
        const std::lock_guard<std::mutex> lock(mutex_);
        const auto key = std::make_tuple(folder_, language.language, language.country);
        const auto found = loaded_.find(key);
        if (found != loaded_.end())
        {
            return found->second;
        }
        return loaded_.emplace(key, loadCatalogue(folder_, language)).first->second;
    }

  private:
    std::mutex mutex_;
    std::string folder_ = getInstalledCatalogues();
    std::map<std::tuple<std::string, std::string, std::string>, std::locale> loaded_;
};

Catalogues &catalogues()
{
    static Catalogues instance;
    return instance;
}

} // namespace

const char *findTranslation(const VkLocale &locale, const std::string &key, const char *english)
{
    if (isUntranslated(locale.name()))
    {
        return nullptr;
    }
    const Language language = parseLocaleName(locale.name());
    if (language.language.empty())
    {
        return nullptr;
    }
    const std::locale catalogue = catalogues().get(language);
    if (!std::has_facet<Messages>(catalogue))
    {
        return nullptr;
    }
    const auto &messages = std::use_facet<Messages>(catalogue);
    const char *const translation = messages.get(messages.domain(domain), key.c_str(), english);
    return translation != nullptr && *translation != '\0' ? translation : nullptr;
}

} // namespace fl::i18n

namespace vclink_host
{

void setCatalogueFolder(const std::string &folder)
{
    fl::i18n::catalogues().setFolder(folder);
}

} // namespace vclink_host
