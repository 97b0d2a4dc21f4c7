// SPDX-License-Identifier: MIT
#include <string>

#include "Output.hpp"
#include "Session.hpp"
#include "commands.hpp"
#include "fl/i18n/convert.hpp"
#include "names.hpp"

namespace vclink::shell
{
namespace
{

class ProbeCommand : public Command
{
  public:
    void declare(CLI::App &line) override
    {
        line.add_option("FOLDER", folder_, "The folder to look at")->required()->type_name("");
        line.footer("Prints \"yes\" or \"no\", and ends with status 0 or 1. The folder itself has "
                    "to be the root of a\nworking copy, or a bare repository: for a folder inside "
                    "one the answer is \"no\".");
    }

    ExitStatus run(Session &session) override
    {
        const bool served = session.factory().isAdapterFor(makePath(resolveArgument(folder_)));
        session.output().write(served ? "yes\n" : "no\n");
        session.output().flush();
        if (served)
        {
            remark("served by the back end \"" +
                   fl::i18n::ustring_to_utf8(session.factory().getName()) + '"');
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
