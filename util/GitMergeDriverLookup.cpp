// SPDX-License-Identifier: MIT
#include "util/GitMergeDriverLookup.hpp"

#include <memory>
#include <stdexcept>
#include <string>

#include <git2/config.h>
#include <git2/errors.h>

#include "error/errorUtil/GitResult.hpp"
#include "error/errorUtil/callbackException.hpp"
#include "error/logging/ScopeTrace.hpp"
#include "error/logging/logger.hpp"
#include "util/externalMerge.hpp"

namespace vclink::git
{
namespace
{

struct ReleaseConfigEntry
{
    void operator()(git_config_entry *entry) const
    {
        git_config_entry_free(entry);
    }
};
using OwnedConfigEntry = std::unique_ptr<git_config_entry, ReleaseConfigEntry>;

void reportMissing(const FileVersions &sides)
{
    if (sides.ancestor == nullptr)
    {
        writeRecord(SeverityDiagnostic, "base is nullptr");
    }
    if (sides.ours == nullptr)
    {
        writeRecord(SeverityDiagnostic, "mine is nullptr");
    }
    if (sides.theirs == nullptr)
    {
        writeRecord(SeverityDiagnostic, "theirs is nullptr");
    }
}

/// Runs a configured merge command for one file; see wildcardApplyEntry().
int wildcardGitDriverApplyCallback(git_merge_driver * /*self*/, const char **pathOut,
                                   std::uint32_t *modeOut, git_buf *mergedOut,
                                   const char *filterName, const git_merge_driver_source *source)
{
    const ScopeTrace trace(
        logger(),
        "int {anonymous}::wildcardGitDriverApplyCallback(git_merge_driver*, const char**, "
        "uint32_t*, git_buf*, const char*, const git_merge_driver_source*)",
        "util/GitMergeDriverLookup", 101);
    writeRecord(SeverityParameter, " filter_name=", filterName);
    const FileVersions sides(source);
    if (!sides.areComplete())
    {
        reportMissing(sides);
        return GIT_EMERGECONFLICT;
    }
    git_repository *const repository = git_merge_driver_source_repo(source);
    const std::string key = "merge." + std::string(filterName) + ".driver";
    const OwnedHandle<git_config> snapshot =
        acquire<git_config>(git_repository_config_snapshot, repository).value();
    git_config_entry *found = nullptr;
    const int code = git_config_get_entry(&found, snapshot.get(), key.c_str());
    const OwnedConfigEntry entry(found);
    if (code != 0)
    {
        writeRecord(SeverityStackTrace, "Merge driver ", key, " not found");
        return GIT_PASSTHROUGH;
    }
    if (entry->value == nullptr)
    {
        throw std::logic_error("'" + key + "' has no value");
    }
    const std::string command = entry->value;
    writeRecord(SeverityDiagnostic, entry->name, " ", command);
    return runExternalMerge(command, sides, repository, {pathOut, modeOut, mergedOut});
}

/// The run that the entry calls, set once.
auto driverRun()
{
    static const auto run = &wildcardGitDriverApplyCallback;
    return run;
}

} // namespace

GitMergeDriverLookup registerMergeDrivers()
{
    GitMergeDriverLookup lookup;
    git_merge_driver &driver = lookup["*"];
    driver = {GIT_MERGE_DRIVER_VERSION, nullptr, nullptr, wildcardApplyEntry};
    driverRun();
    static_cast<void>(git_merge_driver_register("*", &driver));
    return lookup;
}

void unregisterMergeDrivers(GitMergeDriverLookup &lookup)
{
    for (const auto &[name, driver] : lookup)
    {
        writeRecord(SeverityDiagnostic, "Unregister merge driver: ", name);
        static_cast<void>(git_merge_driver_unregister(name.c_str()));
    }
}

int wildcardApplyEntry(git_merge_driver *self, const char **pathOut, std::uint32_t *modeOut,
                       git_buf *mergedOut, const char *filterName,
                       const git_merge_driver_source *source) noexcept
{
    try
    {
        return driverRun()(self, pathOut, modeOut, mergedOut, filterName, source);
    }
    catch (...)
    {
        return parkCallbackException();
    }
}

} // namespace vclink::git
