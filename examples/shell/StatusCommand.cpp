// SPDX-License-Identifier: MIT
#include <filesystem>
#include <string>
#include <system_error>
#include <vector>

#include "Output.hpp"
#include "Session.hpp"
#include "arguments.hpp"
#include "commands.hpp"
#include "fl/i18n/convert.hpp"
#include "links.hpp"
#include "namedPaths.hpp"
#include "names.hpp"
#include "refusals.hpp"
#include "renames.hpp"
#include "states.hpp"
#include "texts.hpp"
#include "workingCopy.hpp"

namespace vclink::shell
{
namespace
{

std::string describeStates()
{
    std::string text =
        say("One line for each file that is not clean: its state, a tab, and its path "
            "from the current folder.\nIgnored files are left out. The states:") +
        "\n\n";
    for (const StateWords &words : stateWords)
    {
        const std::string name = words.name;
        text += "  " + name + std::string(14 - name.size(), ' ') + say(words.meaning) + '\n';
    }
    return text;
}

/// Why a name has no state, unless there is a file or folder that just has none.
std::string explain(const upath &root, const NamedPath &named, const FileStateMap &states)
{
    const upath path = canonicalForm(named.path);
    const bool isInside = liesIn(path.string(), root.string());
    const auto known = states.lower_bound(path);
    std::error_code ignored;
    const bool isThere =
        std::filesystem::exists(std::filesystem::symlink_status(nativePath(named.path), ignored)) ||
        (known != states.end() && liesIn(known->first.string(), path.string()));
    return isInside && isThere
               ? std::string()
               : explainAbsence(root, {named.argument, isInside ? named.path : path, {}});
}

/// The states of what Git has under the names of symbolic links, not of what they lead to.
FileStateMap collectLinks(CMAdapter &adapter, const std::vector<std::string> &arguments)
{
    FileStateMap states;
    const std::vector<NamedPath> links = lookUp(adapter, arguments);
    refuseUnless(say("Not every name is known"), links,
                 [&adapter](const NamedPath &named)
                 {
                     std::error_code ignored;
                     const bool isLink =
                         std::filesystem::is_symlink(nativePath(named.path), ignored);
                     return named.states.empty() && !isLink
                                ? explainAbsence(adapter.getRootFolder(), named)
                                : std::string();
                 });
    for (const NamedPath &named : links)
    {
        states.insert(named.states.begin(), named.states.end());
    }
    return states;
}

/// The states of what the person named. A folder is asked for by itself; all files go in one call.
FileStateMap collectStates(CMAdapter &adapter, const std::vector<std::string> &arguments)
{
    const upath &root = adapter.getRootFolder();
    std::vector<std::string> links;
    std::vector<std::string> notLinks;
    for (const std::string &argument : arguments)
    {
        const upath entry = entryForm(resolveArgument(argument), root);
        const bool isLink = liesIn(entry.string(), root.string()) && isFollowed(entry, root);
        (isLink ? links : notLinks).push_back(argument);
    }
    FileStateMap states = collectLinks(adapter, links);
    std::vector<NamedPath> others;
    std::vector<upath> files;
    for (NamedPath &named : lookUpFolders(adapter, notLinks))
    {
        if (named.states.empty())
        {
            files.push_back(named.path);
            others.push_back(named);
        }
        states.merge(named.states);
    }
    FileStateMap single = statesOf(adapter, files);
    if (single.empty())
    {
        refuseUnknownStates(adapter);
    }
    refuseUnless(say("Not every name is known"), others,
                 [&](const NamedPath &named) { return explain(root, named, single); });
    states.merge(single);
    return states;
}

class StatusCommand : public Command
{
  public:
    void declare(CLI::App &line) override
    {
        line.footer(describeStates());
        line.add_flag("-a,--all", showsAll_, say("Show clean files too"));
        line.add_flag("-z", endWithNul_,
                      say("End each line with NUL, and write names byte for byte, without colour"));
        paths_ = declarePaths(line, say("Only these files, and all files below these folders"));
    }

    ExitStatus run(Session &session) override
    {
        CMAdapter &adapter = session.workingCopy();
        const upath &root = adapter.getRootFolder();
        refuseUnreadableHead(adapter);
        const FileStateMap states = paths_->empty() ? folderStates(adapter, root)
                                                    : collectStates(adapter, paths_->results());
        if (states.empty())
        {
            refuseUnknownStates(adapter);
        }
        const ustring folder = makePath(currentFolder()).string();
        for (const auto &[path, state] : states)
        {
            if (showsAll_ || state.getState() != FileState::Clean)
            {
                writeRecord(session.output(), wordsFor(state), wayTo(path, folder));
            }
        }
        session.output().flush();
        remark(countStates(states));
        return Done;
    }

  private:
    void writeRecord(Output &output, const StateWords &words, const ustring &name) const
    {
        const bool coloured = !endWithNul_ && *words.colour != '\0' && output.hasColour();
        std::string record = coloured ? words.colour : "";
        record += words.name;
        record += coloured ? "\33[m\t" : "\t";
        if (endWithNul_)
        {
            output.writeRaw(record + fl::i18n::ustring_to_utf8(name) + '\0');
        }
        else
        {
            output.write(record + quoteName(name) + '\n');
        }
    }

    bool showsAll_ = false;
    bool endWithNul_ = false;
    const CLI::Option *paths_ = nullptr;
};

} // namespace

std::unique_ptr<Command> makeStatusCommand()
{
    return std::make_unique<StatusCommand>();
}

} // namespace vclink::shell
