// SPDX-License-Identifier: MIT
#include <algorithm>
#include <string>
#include <vector>

#include <CLI/CLI.hpp>

#include "Output.hpp"
#include "Session.hpp"
#include "commands.hpp"
#include "convertedFiles.hpp"
#include "failures.hpp"
#include "fl/i18n/convert.hpp"
#include "mergeLeftovers.hpp"
#include "namedPaths.hpp"
#include "renames.hpp"
#include "runStoppable.hpp"
#include "states.hpp"
#include "texts.hpp"
#include "unfinished.hpp"
#include "vclink/git/LibGit2Exception.hpp"
#include "workingCopy.hpp"

namespace vclink::shell
{
namespace
{

/// @throws ShellFailure when there are any
void refuseConflicts(const FileStateMap &states)
{
    const FileStateMap conflicts = filter(states, isInConflict);
    if (!conflicts.empty())
    {
        throw ShellFailure(say(
            "Nothing was committed, because these files are in conflict:%1%\nEdit each until it "
            "is right, and mark it with \"vclink-shell resolved\". With --as-is the commit\n"
            "takes them as they are, with any conflict markers.",
            listNames(conflicts)));
    }
}

/// @throws ShellFailure if the commit would store what is on the disk in place of what git stores
void refuseUnconverted(CMAdapter &adapter, const FileStateMap &states)
{
    const FileStateMap unconverted = findUnconverted(adapter, states);
    if (!unconverted.empty())
    {
        throw ShellFailure(
            say("Nothing was committed, because git converts these files before it stores them, "
                "and vclink-shell\ncannot:%1%\nUse \"git commit -a\". If you have not changed "
                "them, \"git status\" is enough: then commit again. With\n--as-is the commit "
                "stores what is on the disk.",
                listNames(unconverted)));
    }
}

bool isBlank(const std::string &text)
{
    return text.find_first_not_of(" \t\r\n\v\f") == std::string::npos;
}

/// @throws ShellFailure if the commit would change nothing
void refuseEmpty(CMAdapter &adapter, const FileStateMap &states)
{
    if (!filter(states, isChanged).empty() || isMergeUnderWay(adapter))
    {
        return;
    }
    const std::size_t untracked =
        filter(states, [](FileState::State state) { return !isTracked(state); }).size();
    const std::string nothing = say("Nothing was committed: no tracked file has changed.");
    throw ShellFailure(
        untracked == 0
            ? nothing
            : nothing + '\n' +
                  say("Untracked: %1%. To commit them, add them with \"vclink-shell add\".",
                      countFiles(untracked)));
}

class CommitCommand : public Command
{
  public:
    void declare(CLI::App &line) override
    {
        message_ =
            line.add_option_function<std::string>(
                    "-m", [](const std::string & /*message*/) {}, say("What the commit says"))
                ->type_name("MESSAGE")
                ->option_text("MESSAGE")
                ->required();
        line.add_flag_callback(
            "-a,--all", [] {}, say("Has no effect: a commit takes all changes anyway"));
        line.add_flag("--allow-empty", mayBeEmpty_, say("Commit even if nothing has changed"));
        line.add_flag("--allow-empty-message", mayBeSilent_, say("Commit with an empty message"));
        line.add_flag(
            "--as-is", takesAll_,
            say("Commit files as they are on the disk, also with conflict markers, or if git would "
                "convert\nthem by a filter; commit also during a rebase, a bisection or a series "
                "of picked\ncommits, which ends it"));
        line.footer(say("Commits all changes to tracked files, staged or not, and all that was "
                        "added or removed. Concludes a\nmerge that is under way. The author comes "
                        "from git's settings user.name and user.email; if they are\nnot set, from "
                        "USER or LOGNAME and the machine's name."));
    }

    ExitStatus run(Session &session) override
    {
        CMAdapter &adapter = session.workingCopy();
        const upath &root = adapter.getRootFolder();
        const FileStateMap states = takesAll_ ? folderStates(adapter, root) : wholeStates(adapter);
        const std::string &message = message_->results().front();
        if (isBlank(message) && !mayBeSilent_)
        {
            throw ShellFailure(say("Nothing was committed: the message is empty."));
        }
        if (!takesAll_)
        {
            refuseHalfWay(adapter);
            refuseConflicts(states);
            refuseUnconverted(adapter, states);
        }
        if (!mayBeEmpty_)
        {
            refuseEmpty(adapter, states);
        }
        tellSetAside(adapter);
        const ExitStatus status =
            runStoppable(session, Stops::Never, [&] { commit(adapter, message); });
        if (status != Done)
        {
            return status;
        }
        remark(describeResult(adapter, states));
        return Done;
    }

  private:
    static void commit(CMAdapter &adapter, const std::string &message)
    {
        try
        {
            adapter.commit(adapter.getRootFolder(), fl::i18n::utf8_to_ustring(message));
        }
        catch (const git::LibGit2Exception &failure)
        {
            const std::string commands = commandsOf(failure);
            if (commands.empty())
            {
                throw;
            }
            throw ShellFailure(
                isMergeInterrupted(adapter)
                    ? say("Nothing was committed: a merge was interrupted before all of it was "
                          "written, and a commit would\nleave the rest out. To begin again, run "
                          "this in the root of the working copy:\n%1%",
                          commands)
                    : say("Nothing was committed: the index has nothing of what only the other "
                          "side of the merge has changed.\nIf you put that back intentionally, run "
                          "\"git commit\". To begin again, run this in the root of the\nworking "
                          "copy:\n%1%",
                          commands));
        }
    }

    /// What the back end says to run after a merge that was interrupted; nothing for other
    /// failures.
    static std::string commandsOf(const git::LibGit2Exception &failure)
    {
        const std::string text = fl::i18n::ustring_to_utf8(failure.getError().getMessage());
        const std::size_t begin = text.find("git diff-tree ");
        return begin == std::string::npos ? std::string() : text.substr(begin);
    }

    static std::string describeResult(CMAdapter &adapter, const FileStateMap &states)
    {
        const FileStateMap changed = filter(states, isChanged);
        // If Git tracks no file any more, all are committed.
        const FileStateMap after = folderStates(adapter, adapter.getRootFolder());
        // What a sparse checkout leaves out is missing before and after.
        const auto left =
            std::count_if(changed.begin(), changed.end(),
                          [&after](const FileStateMap::value_type &entry)
                          {
                              const auto now = after.find(entry.first);
                              return now != after.end() && isChanged(now->second.getState());
                          });
        const std::size_t count = changed.size() - static_cast<std::size_t>(left);
        return count == 0 ? say("Committed.") : say("Committed %1%.", countFiles(count));
    }

    const CLI::Option *message_ = nullptr;
    bool mayBeEmpty_ = false;
    bool mayBeSilent_ = false;
    bool takesAll_ = false;
};

} // namespace

std::unique_ptr<Command> makeCommitCommand()
{
    return std::make_unique<CommitCommand>();
}

} // namespace vclink::shell
