// SPDX-License-Identifier: MIT
#include "convertedFiles.hpp"

#include <algorithm>
#include <cstddef>
#include <filesystem>
#include <map>
#include <set>
#include <string>
#include <vector>

#include <strings.h>
#include <sys/stat.h>

#include "gitProgram.hpp"
#include "names.hpp"
#include "states.hpp"
#include "workingCopy.hpp"

namespace vclink::shell
{
namespace
{

namespace fs = std::filesystem;

/// A file that a commit may store again, if its content differs.
struct Candidate
{
    FileStateMap::const_iterator entry;
    /// The back end compares the content even if size and times are those of the index.
    bool isAsNewAsIndex;
};

/// By their names below the root.
using Candidates = std::map<std::string, Candidate>;

Candidates findCandidates(const upath &root, const FileStateMap &states)
{
    struct stat ofIndex = {};
    const bool hasIndex = ::stat((stateFolder(nativePath(root)) / "index").c_str(), &ofIndex) == 0;
    Candidates candidates;
    for (auto entry = states.begin(); entry != states.end(); ++entry)
    {
        const FileState::State state = entry->second.getState();
        struct stat status = {};
        if (!isTracked(state) || ::lstat(nativePath(entry->first).c_str(), &status) != 0 ||
            !S_ISREG(status.st_mode))
        {
            continue;
        }
        const bool isNew = hasIndex && status.st_mtim.tv_sec >= ofIndex.st_mtim.tv_sec;
        if (isChanged(state) || isNew)
        {
            candidates.emplace(nativePath(upath(relativeName(entry->first, root))).string(),
                               Candidate{entry, isNew});
        }
    }
    return candidates;
}

/// The filters that have a command for what is stored.
std::set<std::string> readFilters(const fs::path &root)
{
    std::set<std::string> filters;
    const std::string text =
        runGit(root, {"config", "-z", "--get-regexp", "^filter\\..*\\.(clean|process)$"})
            .value_or("");
    for (const std::string &setting : splitAtNul(text))
    {
        // "filter.NAME.clean", a line feed, and the value.
        const std::size_t line = setting.find('\n');
        if (line != std::string::npos && line + 1 < setting.size())
        {
            const std::size_t begin = setting.find('.') + 1;
            filters.insert(setting.substr(begin, setting.rfind('.', line) - begin));
        }
    }
    return filters;
}

/// As git compares names of encodings. Git lists an attribute without a value by these words.
bool isOtherEncoding(const std::string &value)
{
    const std::vector<std::string> others{"", "unspecified", "set", "unset", "UTF-8", "UTF8"};
    return std::none_of(others.begin(), others.end(),
                        [&](const std::string &other)
                        { return ::strcasecmp(value.c_str(), other.c_str()) == 0; });
}

/// The names of those that git converts.
std::vector<std::string> findConverted(const fs::path &root, const Candidates &candidates)
{
    std::string names;
    for (const auto &[name, candidate] : candidates)
    {
        names += name + '\0';
    }
    // The name, the attribute and its value, each with a NUL at its end.
    const std::vector<std::string> pieces = splitAtNul(
        runGit(root, {"check-attr", "-z", "--stdin", "filter", "working-tree-encoding"}, names)
            .value_or(""));
    const std::set<std::string> filters = readFilters(root);
    std::vector<std::string> converted;
    for (std::size_t index = 0; index + 2 < pieces.size(); index += 3)
    {
        const std::string &value = pieces[index + 2];
        if (pieces[index + 1] == "filter" ? filters.count(value) != 0 : isOtherEncoding(value))
        {
            converted.push_back(pieces[index]);
        }
    }
    return converted;
}

/// The files whose size, times or inode are not those of the index.
std::set<std::string> findTouched(const fs::path &root)
{
    const std::vector<std::string> names =
        splitAtNul(runGit(root, {"-c", "core.checkStat=default", "-c", "core.trustctime=true",
                                 "diff-files", "--name-only", "-z", "--ignore-submodules"})
                       .value_or(""));
    return {names.begin(), names.end()};
}

} // namespace

FileStateMap findUnconverted(CMAdapter &adapter, const FileStateMap &states)
{
    FileStateMap found;
    const Candidates candidates = findCandidates(adapter.getRootFolder(), states);
    if (candidates.empty())
    {
        return found;
    }
    const fs::path root = nativePath(adapter.getRootFolder());
    const std::vector<std::string> converted = findConverted(root, candidates);
    if (converted.empty())
    {
        return found;
    }
    const std::set<std::string> touched = findTouched(root);
    for (const std::string &name : converted)
    {
        const auto candidate = candidates.find(name);
        if (candidate != candidates.end() &&
            (candidate->second.isAsNewAsIndex || touched.count(name) != 0))
        {
            found.insert(*candidate->second.entry);
        }
    }
    return found;
}

} // namespace vclink::shell
