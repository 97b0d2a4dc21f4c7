// SPDX-License-Identifier: MIT
#include "overlookedMarks.hpp"

#include <algorithm>
#include <iterator>
#include <system_error>
#include <utility>

#include "failures.hpp"
#include "gitProgram.hpp"
#include "indexEntries.hpp"
#include "names.hpp"
#include "texts.hpp"

namespace vclink::shell
{
namespace
{

void mark(const std::filesystem::path &root, const std::string &option,
          const std::set<std::string> &before, const std::set<std::string> &after)
{
    std::set<std::string> lost;
    std::set_difference(before.begin(), before.end(), after.begin(), after.end(),
                        std::inserter(lost, lost.end()));
    if (lost.empty())
    {
        return;
    }
    std::string input;
    std::string list;
    for (const std::string &name : lost)
    {
        input += name + '\0';
        list += "\n  " + showPath(makePath(root / name));
    }
    if (!runGit(root, {"update-index", option, "-z", "--stdin"}, input))
    {
        complain(say("These files have lost a mark, which \"git update-index %1%\" sets "
                     "again:%2%",
                     option, list));
    }
}

} // namespace

OverlookedMarks::OverlookedMarks(std::filesystem::path root)
    : root_(std::move(root)), before_(read())
{
}

void OverlookedMarks::restore() const
{
    if (before_.assumedUnchanged.empty() && before_.skipped.empty())
    {
        return;
    }
    const Names after = read();
    mark(root_, "--assume-unchanged", before_.assumedUnchanged, after.assumedUnchanged);
    mark(root_, "--skip-worktree", before_.skipped, after.skipped);
}

OverlookedMarks::Names OverlookedMarks::read() const
{
    Names names;
    for (const IndexEntry &entry : readIndex(root_).value_or(std::vector<IndexEntry>()))
    {
        if (entry.isAssumedUnchanged)
        {
            names.assumedUnchanged.insert(entry.name);
        }
        std::error_code ignored;
        const auto status = std::filesystem::symlink_status(root_ / entry.name, ignored);
        // A sparse checkout that leaves a file out has no mark for it once it is written.
        if (entry.isSkipped && std::filesystem::exists(status))
        {
            names.skipped.insert(entry.name);
        }
    }
    return names;
}

} // namespace vclink::shell
