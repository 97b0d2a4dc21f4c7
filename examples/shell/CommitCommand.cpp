// SPDX-License-Identifier: MIT
#include <string>
#include <vector>

#include <CLI/CLI.hpp>

#include "Output.hpp"
#include "Session.hpp"
#include "commands.hpp"
#include "failures.hpp"
#include "fl/i18n/convert.hpp"
#include "namedPaths.hpp"
#include "refusals.hpp"
#include "runStoppable.hpp"
#include "states.hpp"
#include "unfinished.hpp"
#include "workingCopy.hpp"

namespace vclink::shell
{
namespace
{

/// @throws ShellFailure when there are any
void refuseConflicts(const FileStateMap &states, const upath &root)
{
    const FileStateMap conflicts = filter(states, isInConflict);
    if (!conflicts.empty())
    {
        throw ShellFailure(
            "Nothing was committed, because these files are in conflict:" +
            listNames(conflicts, root) +
            "\nMake each as it should be, and mark it with \"vclink-shell resolved\". "
            "With --as-is the commit\ntakes them as they stand, with any conflict "
            "markers.");
    }
}

class CommitCommand : public Command
{
  public:
    void declare(CLI::App &line) override
    {
        message_ = line.add_option_function<std::string>(
                           "-m", [](const std::string & /*message*/) {},
                           "What the commit says, as it stands")
                       ->type_name("MESSAGE")
                       ->option_text("MESSAGE")
                       ->required();
        line.add_flag("--as-is", takesAll_,
                      "Commit files in conflict as they stand, markers included, and in the midst\n"
                      "of a rebase, a bisection or a series of picked commits, which ends it");
        line.footer("All changes to tracked files are in the commit, staged or not, and what was "
                    "added or removed.\n"
                    "A merge that is under way is ended by it. The identity is that of git's "
                    "settings user.name and\n"
                    "user.email; where they are not set, it is made from USER or LOGNAME and the "
                    "name of the host.");
    }

    ExitStatus run(Session &session) override
    {
        CMAdapter &adapter = session.adapter();
        const upath &root = adapter.getRootFolder();
        const FileStateMap states =
            takesAll_ ? adapter.getFolderStates(root) : wholeStates(adapter);
        if (!takesAll_)
        {
            refuseHalfWay(adapter);
            refuseConflicts(states, root);
        }
        const ustring message = fl::i18n::utf8_to_ustring(message_->results().front());
        const ExitStatus status = runStoppable(session, [&] { adapter.commit(root, message); });
        if (status != Done)
        {
            return status;
        }
        // What a sparse checkout leaves out is missing before and after.
        const FileStateMap changed = filter(states, isChanged);
        const std::size_t left = findLeftOut(adapter, changed, isChanged).size();
        remark(states.empty() ? "Committed."
                              : "Committed " + countFiles(changed.size() - left) + '.');
        return Done;
    }

  private:
    const CLI::Option *message_ = nullptr;
    bool takesAll_ = false;
};

} // namespace

std::unique_ptr<Command> makeCommitCommand()
{
    return std::make_unique<CommitCommand>();
}

} // namespace vclink::shell
