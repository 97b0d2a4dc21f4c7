// SPDX-License-Identifier: MIT
#include "indexEntries.hpp"

#include <algorithm>
#include <cctype>
#include <cstddef>
#include <map>

#include "gitProgram.hpp"

namespace vclink::shell
{
namespace
{

constexpr const char *noMode = "000000";

std::vector<std::string> splitAtBlank(const std::string &text)
{
    std::vector<std::string> words;
    for (std::size_t start = 0; start <= text.size();)
    {
        const std::size_t end = text.find(' ', start);
        words.push_back(text.substr(start, end - start));
        start = end == std::string::npos ? text.size() + 1 : end + 1;
    }
    return words;
}

std::optional<std::vector<StagedChange>> askForChanges(const std::filesystem::path &root)
{
    // ":MODE MODE ID ID STATUS", and the name, each with a NUL at its end.
    const auto output =
        runGit(root, {"diff-index", "--cached", "--raw", "-z", "--no-renames", "HEAD"});
    if (!output)
    {
        return std::nullopt;
    }
    std::vector<StagedChange> changes;
    const std::vector<std::string> pieces = splitAtNul(*output);
    for (std::size_t index = 0; index + 1 < pieces.size(); index += 2)
    {
        const std::vector<std::string> words = splitAtBlank(pieces[index]);
        if (words.size() == 5 && words[4] != "U")
        {
            changes.push_back({pieces[index + 1], words[0].substr(1), words[1], words[3], false});
        }
    }
    return changes;
}

/// Git compares nothing before the first commit, or if .gitmodules has an error.
std::optional<std::vector<StagedChange>> compareEntries(const std::filesystem::path &root)
{
    const auto entries = readIndex(root);
    const auto head = runGit(root, {"ls-tree", "-r", "-z", "HEAD"});
    if (!entries || (!head && runGit(root, {"rev-parse", "--quiet", "--verify", "HEAD"})))
    {
        return std::nullopt;
    }
    std::map<std::string, StagedChange> changes;
    // "MODE TYPE ID", a tab, the name, and a NUL.
    for (const std::string &record : splitAtNul(head.value_or("")))
    {
        const std::size_t tab = record.find('\t');
        const std::string name = record.substr(tab + 1);
        const std::vector<std::string> words = splitAtBlank(record.substr(0, tab));
        changes[name] = {name, words.front(), noMode, words.back(), false};
    }
    for (const IndexEntry &entry : *entries)
    {
        if (entry.isInConflict)
        {
            changes.erase(entry.name);
            continue;
        }
        const auto [known, isNew] = changes.try_emplace(
            entry.name, StagedChange{entry.name, noMode, entry.mode, entry.id, false});
        if (isNew)
        {
            continue;
        }
        if (known->second.modeInHead == entry.mode && known->second.id == entry.id)
        {
            changes.erase(known);
            continue;
        }
        known->second.mode = entry.mode;
        known->second.id = entry.id;
    }
    std::vector<StagedChange> list;
    list.reserve(changes.size());
    for (const auto &[name, change] : changes)
    {
        list.push_back(change);
    }
    return list;
}

/// Git lists a file that is only intended to be added as one that is staged without content.
void markIntended(const std::filesystem::path &root, std::vector<StagedChange> &changes)
{
    constexpr const char *emptyBlob = "e69de29bb2d1d6434b8b29ae775ad8c2e48c5391";
    if (std::none_of(changes.begin(), changes.end(),
                     [](const StagedChange &change) { return change.id == emptyBlob; }))
    {
        return;
    }
    const std::vector<std::string> names =
        splitAtNul(runGit(root, {"diff-files", "--ita-invisible-in-index", "--diff-filter=A",
                                 "--name-only", "-z"})
                       .value_or(""));
    for (StagedChange &change : changes)
    {
        change.isIntended = std::find(names.begin(), names.end(), change.name) != names.end();
    }
}

} // namespace

bool StagedChange::isAdded() const
{
    return modeInHead == noMode;
}

bool StagedChange::isDeleted() const
{
    return mode == noMode;
}

bool IndexEntry::isOverlooked() const
{
    return isAssumedUnchanged || isSkipped;
}

std::optional<std::vector<StagedChange>> readStagedChanges(const std::filesystem::path &root)
{
    auto changes = askForChanges(root);
    changes = changes ? changes : compareEntries(root);
    if (changes)
    {
        markIntended(root, *changes);
    }
    return changes;
}

std::optional<std::vector<IndexEntry>> readIndex(const std::filesystem::path &root)
{
    // "TAG MODE ID STAGE", a tab, the name, and a NUL.
    const auto output = runGit(root, {"ls-files", "-v", "--stage", "-z"});
    if (!output)
    {
        return std::nullopt;
    }
    std::vector<IndexEntry> entries;
    for (const std::string &record : splitAtNul(*output))
    {
        const std::size_t tab = record.find('\t');
        const std::vector<std::string> words = splitAtBlank(record.substr(0, tab));
        if (tab != std::string::npos && words.size() == 4)
        {
            const char letter = words[0].front();
            // "S" is "skip worktree"; a small letter means "assume unchanged".
            const bool isSmall = std::islower(static_cast<unsigned char>(letter)) != 0;
            entries.push_back({record.substr(tab + 1), words[1], words[2], isSmall,
                               letter == 'S' || letter == 's', words[3] != "0"});
        }
    }
    return entries;
}

} // namespace vclink::shell
