// SPDX-License-Identifier: MIT
#include "PushRefspec.hpp"

#include <algorithm>
#include <string_view>

#include "failures.hpp"
#include "names.hpp"
#include "revisions.hpp"
#include "suggestions.hpp"
#include "texts.hpp"

namespace vclink::shell
{
namespace
{

constexpr std::string_view heads = "refs/heads/";
constexpr std::string_view tags = "refs/tags/";

bool begins(const std::string &text, std::string_view beginning)
{
    return text.compare(0, beginning.size(), beginning) == 0;
}

/// The folder of the one reference that a short name means; empty if there is none.
/// @throws ShellFailure if there are two
std::string_view folderOf(const std::string &name, bool isBranch, bool isTag)
{
    if (isBranch && isTag)
    {
        throw ShellFailure(say("Nothing was pushed: there are a branch and a tag '%1%'. Use "
                               "refs/heads/%1% or refs/tags/%1%.",
                               name));
    }
    if (isBranch)
    {
        return heads;
    }
    return isTag ? tags : std::string_view();
}

std::string completeSource(const git::BranchManager &manager, const std::string &name,
                           const std::string &currentBranch)
{
    if (name == "HEAD" && !currentBranch.empty())
    {
        return std::string(heads) + currentBranch;
    }
    if (name.empty() || begins(name, "refs/"))
    {
        return name;
    }
    // "main~1" is a commit, but not the name of a branch.
    const bool isName = name.find_first_of("~^:@") == std::string::npos;
    const bool isBranch = isName && findRevision(manager, std::string(heads) + name).has_value();
    const bool isTag = isName && findRevision(manager, std::string(tags) + name).has_value();
    return std::string(folderOf(name, isBranch, isTag)) + name;
}

/// The folder for a short name at the remote, by what is pushed there, or by what is there.
std::string completeTarget(const std::string &name, const std::string &source,
                           const AskHeads &askHeads)
{
    if (begins(name, "refs/"))
    {
        return name;
    }
    for (const std::string_view folder : {heads, tags})
    {
        if (begins(source, folder))
        {
            return std::string(folder) + name;
        }
    }
    const std::vector<git::GitRemoteHead> there = askHeads();
    const auto has = [&there, &name](std::string_view folder)
    {
        return std::any_of(there.begin(), there.end(),
                           [&](const git::GitRemoteHead &head)
                           { return head.name == std::string(folder) + name; });
    };
    const std::string_view folder = folderOf(name, has(heads), has(tags));
    if (folder.empty())
    {
        throw ShellFailure(say("Nothing was pushed: the remote has no branch and no tag '%1%'. Use "
                               "a full name, e.g. refs/heads/%1%.",
                               name));
    }
    return std::string(folder) + name;
}

} // namespace

std::string PushRefspec::text() const
{
    return (mayLoseCommits ? "+" : "") + source + ':' + target;
}

std::string PushRefspec::describe(const std::string &remote) const
{
    if (source.empty())
    {
        return say("Deleted %1% at %2%.", shortReference(target), remote);
    }
    return source == target ? say("Pushed %1% to %2%.", shortReference(target), remote)
                            : say("Pushed %1% to %2% at %3%.", shortReference(source),
                                  shortReference(target), remote);
}

std::string noCurrentBranch()
{
    return say("Nothing was pushed: there is no current branch. Name what to push, e.g. "
               "HEAD:refs/heads/NAME.");
}

std::string shortReference(const std::string &name)
{
    for (const std::string_view folder : {heads, tags})
    {
        if (begins(name, folder))
        {
            return name.substr(folder.size());
        }
    }
    return name;
}

PushRefspec readPushRefspec(const git::BranchManager &manager, const std::string &refspec,
                            const std::string &currentBranch, const AskHeads &askHeads)
{
    PushRefspec result;
    result.mayLoseCommits = begins(refspec, "+");
    const std::string text = refspec.substr(result.mayLoseCommits ? 1 : 0);
    const std::size_t colon = text.find(':');
    result.source = completeSource(manager, text.substr(0, colon), currentBranch);
    const bool isDetachedHead = result.source == "HEAD" && colon != std::string::npos;
    if (result.source == "HEAD" && !isDetachedHead)
    {
        throw ShellFailure(noCurrentBranch());
    }
    if (!result.source.empty() && !begins(result.source, "refs/") && !isDetachedHead)
    {
        throw ShellFailure(say("Nothing was pushed: there is no branch and no tag '%1%' here.",
                               showName(text.substr(0, colon))) +
                           suggestBranch(manager, text.substr(0, colon)));
    }
    result.target = colon == std::string::npos
                        ? result.source
                        : completeTarget(text.substr(colon + 1), result.source, askHeads);
    return result;
}

} // namespace vclink::shell
