// SPDX-License-Identifier: MIT
#include "util/repository/settings.hpp"

#include <array>
#include <string>

#include <git2/config.h>
#include <git2/errors.h>
#include <git2/repository.h>

#include "error/errorUtil/GitResult.hpp"
#include "error/errorUtil/raiseGitError.hpp"

namespace vclink::git
{
namespace
{

/// The values that libgit2 reads.
struct Setting
{
    const char *name;
    std::array<git_configmap, 4> values;
    std::size_t count;
    /// for a text
    const char *names;
};

constexpr git_configmap falseValue{GIT_CONFIGMAP_FALSE, nullptr, 0};
constexpr git_configmap trueValue{GIT_CONFIGMAP_TRUE, nullptr, 0};

constexpr git_configmap word(const char *text)
{
    return {GIT_CONFIGMAP_STRING, text, 0};
}

constexpr std::array<Setting, 4> mappedSettings{{
    {"core.autocrlf", {falseValue, trueValue, word("input")}, 3, "true, false or input"},
    {"core.safecrlf", {falseValue, trueValue, word("warn")}, 3, "true, false or warn"},
    {"core.eol", {falseValue, word("lf"), word("crlf"), word("native")}, 4, "lf, crlf or native"},
    {"core.logAllRefUpdates", {falseValue, trueValue, word("always")}, 3, "true, false or always"},
}};

/// Returns an empty text for a setting without a value.
std::string valueOf(const char *setting, git_repository *repository)
{
    const auto config = acquire<git_config>(git_repository_config_snapshot, repository).value();
    const char *value = nullptr;
    check(git_config_get_string, &value, config.get(), setting);
    return value;
}

[[noreturn]] void raiseUnreadableSetting(const Setting &setting, const std::string &value)
{
    const std::string name = setting.name;
    raiseGitError(GIT_ERROR, GIT_ERROR_CONFIG,
                  name + " is '" + value + "', which libgit2 cannot read: set it to " +
                      setting.names + ", or remove it ('git config --show-origin " + name +
                      "' names the file)");
}

} // namespace

bool isSet(git_config *config, const char *setting)
{
    int value = 0;
    const GitResult<void> found = call(git_config_get_bool, &value, config, setting);
    if (found.has_error() && found.error().getCode() == GIT_ENOTFOUND)
    {
        return false;
    }
    check(found);
    return value != 0;
}

void refuseUnreadableSettings(git_repository *repository)
{
    // The one from which libgit2 takes them.
    const auto config = acquire<git_config>(git_repository_config, repository).value();
    for (const Setting &setting : mappedSettings)
    {
        int ignored = 0;
        const GitResult<void> read = call(git_config_get_mapped, &ignored, config.get(),
                                          setting.name, setting.values.data(), setting.count);
        if (read.has_error() && read.error().getErrorClass() == GIT_ERROR_CONFIG &&
            read.error().getCode() == GIT_ERROR)
        {
            raiseUnreadableSetting(setting, valueOf(setting.name, repository));
        }
        if (read.has_error() && read.error().getCode() != GIT_ENOTFOUND)
        {
            check(read);
        }
    }
}

} // namespace vclink::git
