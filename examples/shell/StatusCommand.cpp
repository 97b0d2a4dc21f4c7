// SPDX-License-Identifier: MIT
#include <string>
#include <vector>

#include "Output.hpp"
#include "Session.hpp"
#include "arguments.hpp"
#include "commands.hpp"
#include "fl/i18n/convert.hpp"
#include "namedPaths.hpp"
#include "names.hpp"
#include "states.hpp"
#include "workingCopy.hpp"

namespace vclink::shell
{
namespace
{

std::string describeStates()
{
    std::string text = "One line for each file: its state, a tab, and its path from the root of "
                       "the working copy.\nIgnored files are left out. The states:\n\n";
    for (const StateWords &words : stateWords)
    {
        const std::string name = words.name;
        text += "  " + name + std::string(14 - name.size(), ' ') + words.meaning + '\n';
    }
    text += "\nWithout -z, a name with a control character, a double quote, a backslash or bytes "
            "that are not\nUTF-8 is shown in double quotes and escaped, as git does. The counts "
            "go to standard error, if\nthat is a terminal.";
    return text;
}

/// The states of what the person named. A folder is asked for by itself; all files go in one call.
FileStateMap collectStates(CMAdapter &adapter, const std::vector<std::string> &arguments)
{
    FileStateMap states;
    std::vector<upath> files;
    for (NamedPath &named : lookUpFolders(adapter, arguments))
    {
        if (named.states.empty())
        {
            files.push_back(named.path);
        }
        states.merge(named.states);
    }
    FileStateMap single = adapter.getFileStates(files);
    states.merge(single);
    return states;
}

class StatusCommand : public Command
{
  public:
    void declare(CLI::App &line) override
    {
        line.footer(describeStates());
        line.add_flag("-z", endWithNul_,
                      "End each line with NUL, and write names byte for byte, without colour");
        paths_ = declarePaths(line, "Only these files, and all files below these folders");
    }

    ExitStatus run(Session &session) override
    {
        CMAdapter &adapter = session.adapter();
        const upath &root = adapter.getRootFolder();
        const FileStateMap states = paths_->empty() ? adapter.getFolderStates(root)
                                                    : collectStates(adapter, paths_->results());
        if (states.empty())
        {
            refuseUnknownStates(adapter);
        }
        for (const auto &[path, state] : states)
        {
            writeRecord(session.output(), wordsFor(state), relativeName(path, root));
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
        record += endWithNul_ ? fl::i18n::ustring_to_utf8(name) : quoteName(name);
        record += endWithNul_ ? '\0' : '\n';
        output.write(record);
    }

    bool endWithNul_ = false;
    const CLI::Option *paths_ = nullptr;
};

} // namespace

std::unique_ptr<Command> makeStatusCommand()
{
    return std::make_unique<StatusCommand>();
}

} // namespace vclink::shell
