// SPDX-License-Identifier: MIT
#include <filesystem>
#include <string>
#include <system_error>

#include <CLI/CLI.hpp>

#include "Output.hpp"
#include "Session.hpp"
#include "arguments.hpp"
#include "commands.hpp"
#include "failures.hpp"
#include "fl/i18n/convert.hpp"
#include "names.hpp"
#include "texts.hpp"
#include "vclink/git/GitAttributes.hpp"

namespace vclink::shell
{
namespace
{

namespace fs = std::filesystem;

/// Where a file lies below the root. Links are followed only on the way to the root: below it, the
/// name counts, as with git check-attr.
/// @throws ShellFailure when it does not lie there
upath findBelow(const upath &root, const std::string &argument)
{
    const fs::path path = resolveArgument(argument).lexically_normal();
    for (fs::path folder = path; folder.has_relative_path(); folder = folder.parent_path())
    {
        std::error_code ignored;
        const fs::path rest = path.lexically_relative(folder);
        if (rest != "." && fs::equivalent(folder, nativePath(root), ignored))
        {
            return makePath(rest);
        }
    }
    throw ShellFailure(say("%1% is not in the working copy %2%.",
                           quoteName(fl::i18n::utf8_to_ustring(argument)),
                           nativePath(root).string()));
}

class AttributesCommand : public Command
{
  public:
    void declare(CLI::App &line) override
    {
        path_ = declareName(line, "PATH", say("A file, which need not exist"))->required();
        names_ = declareNames(line, "NAME", say("Attributes"))->required();
        line.footer(say("One line for each attribute, as a .gitattributes file has it: \"NAME\", "
                        "\"-NAME\", \"NAME=VALUE\",\nor \"!NAME\" if it is not specified."));
    }

    ExitStatus run(Session &session) override
    {
        CMAdapter &adapter = session.adapter();
        const upath path = findBelow(adapter.getRootFolder(), path_->results().front());
        const auto attributes = git::GitAttributes::create(adapter);
        for (const std::string &name : names_->results())
        {
            const git::GitAttribute attribute =
                attributes->getAttribute(path, fl::i18n::utf8_to_ustring(name));
            const ustring line = fl::i18n::utf8_to_ustring(git::serialize(attribute));
            session.output().write(makePrintableLine(line) + '\n');
        }
        return Done;
    }

  private:
    const CLI::Option *path_ = nullptr;
    const CLI::Option *names_ = nullptr;
};

} // namespace

std::unique_ptr<Command> makeAttributesCommand()
{
    return std::make_unique<AttributesCommand>();
}

} // namespace vclink::shell
