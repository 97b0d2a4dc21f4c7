// SPDX-License-Identifier: MIT
#include <string>
#include <vector>

#include <CLI/CLI.hpp>

#include "Output.hpp"
#include "Session.hpp"
#include "commands.hpp"
#include "failures.hpp"
#include "fl/i18n/convert.hpp"
#include "mergeLeftovers.hpp"
#include "namedPaths.hpp"
#include "refusals.hpp"
#include "renames.hpp"
#include "runStoppable.hpp"
#include "states.hpp"
#include "texts.hpp"
#include "unfinished.hpp"
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
    throw ShellFailure(untracked == 0 ? nothing
                                      : nothing + '\n' +
                                            say("Untracked: %1%. Add what is to be committed with "
                                                "\"vclink-shell add\".",
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
            "-a,--all", [] {}, say("Changes nothing: a commit takes all changes anyway"));
        line.add_flag("--allow-empty", mayBeEmpty_, say("Commit even if nothing has changed"));
        line.add_flag("--allow-empty-message", mayBeSilent_, say("Commit with an empty message"));
        line.add_flag(
            "--as-is", takesAll_,
            say("Commit files in conflict as they are, markers included, and in the midst\n"
                "of a rebase, a bisection or a series of picked commits, which ends it"));
        line.footer(
            say("Commits all changes to tracked files, staged or not, and what was added or "
                "removed. Concludes a\nmerge that is under way. The author comes from git's "
                "settings user.name and user.email, or else\nfrom USER or LOGNAME and the "
                "name of the host."));
    }

    ExitStatus run(Session &session) override
    {
        CMAdapter &adapter = session.adapter();
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
        }
        if (!mayBeEmpty_)
        {
            refuseEmpty(adapter, states);
        }
        tellSetAside(adapter);
        const ExitStatus status =
            runStoppable(session, Stops::Never,
                         [&] { adapter.commit(root, fl::i18n::utf8_to_ustring(message)); });
        if (status != Done)
        {
            return status;
        }
        // What a sparse checkout leaves out is missing before and after.
        const FileStateMap changed = filter(states, isChanged);
        const std::size_t left = findLeftOut(adapter, changed, isChanged).size();
        remark(states.empty() ? say("Committed.")
                              : say("Committed %1%.", countFiles(changed.size() - left)));
        return Done;
    }

  private:
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
