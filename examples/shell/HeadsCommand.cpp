// SPDX-License-Identifier: MIT
#include <string>
#include <vector>

#include <CLI/CLI.hpp>

#include "Output.hpp"
#include "Session.hpp"
#include "commands.hpp"
#include "fl/i18n/convert.hpp"
#include "names.hpp"
#include "remotes.hpp"
#include "runWithRemote.hpp"
#include "texts.hpp"

namespace vclink::shell
{
namespace
{

class HeadsCommand : public Command
{
  public:
    void declare(CLI::App &line) override
    {
        remote_ = declareRemote(line);
        line.add_flag("-z", endWithNul_,
                      say("End each line with NUL, and write names byte for byte"));
        line.footer(say("One line for each reference of the remote: the id, a tab, and the full "
                        "name. A symbolic reference\nsuch as HEAD has another tab and the name "
                        "that it points to. A name that ends in \"^{}\" is the\nobject that a tag "
                        "points to.\n\nNever prompts (see clone)."));
    }

    ExitStatus run(Session &session) override
    {
        const std::string name = chooseRemote(session, *remote_, Direction::Here);
        const auto remote = openRemote(session, name, Direction::Here);
        RemoteNotes notes;
        std::vector<git::GitRemoteHead> heads;
        const ExitStatus status = runWithRemote(session, say("Asking %1%:", name), notes,
                                                [&]
                                                {
                                                    heads = remote->getRemoteHeads();
                                                    return Done;
                                                });
        if (status != Done)
        {
            return status;
        }
        for (const git::GitRemoteHead &head : heads)
        {
            writeRecord(session.output(), head);
        }
        session.output().flush();
        remark(sayCount(heads.size(), "%1% reference", "%1% references"));
        return Done;
    }

  private:
    void writeRecord(Output &output, const git::GitRemoteHead &head) const
    {
        std::string record = hexadecimal(head.oid) + '\t' + show(head.name);
        if (!head.symrefTarget.empty())
        {
            record += '\t' + show(head.symrefTarget);
        }
        if (endWithNul_)
        {
            output.writeRaw(record + '\0');
        }
        else
        {
            output.write(record + '\n');
        }
    }

    std::string show(const std::string &name) const
    {
        return endWithNul_ ? name : quoteName(fl::i18n::utf8_to_ustring(name));
    }

    const CLI::Option *remote_ = nullptr;
    bool endWithNul_ = false;
};

} // namespace

std::unique_ptr<Command> makeHeadsCommand()
{
    return std::make_unique<HeadsCommand>();
}

} // namespace vclink::shell
