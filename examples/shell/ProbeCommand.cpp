// SPDX-License-Identifier: MIT
#include <string>

#include "Output.hpp"
#include "Session.hpp"
#include "commands.hpp"
#include "fl/i18n/convert.hpp"
#include "names.hpp"
#include "texts.hpp"

namespace vclink::shell
{
namespace
{

class ProbeCommand : public Command
{
  public:
    void declare(CLI::App &line) override
    {
        line.add_option("FOLDER", folder_, say("The folder to look at"))->required()->type_name("");
        line.footer(
            say("Prints \"yes\" or \"no\", and ends with status 0 or 1. The answer is \"yes\" "
                "for the root of a working\ncopy and for a bare repository, and \"no\" for "
                "a folder inside one."));
    }

    ExitStatus run(Session &session) override
    {
        const bool served = session.factory().isAdapterFor(makePath(resolveArgument(folder_)));
        session.output().write(served ? "yes\n" : "no\n");
        session.output().flush();
        if (served)
        {
            remark(say("served by the back end \"%1%\"",
                       fl::i18n::ustring_to_utf8(session.factory().getName())));
        }
        return served ? Done : Failed;
    }

  private:
    std::string folder_;
};

} // namespace

std::unique_ptr<Command> makeProbeCommand()
{
    return std::make_unique<ProbeCommand>();
}

} // namespace vclink::shell
