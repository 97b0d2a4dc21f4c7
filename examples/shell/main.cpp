// SPDX-License-Identifier: MIT
#include <filesystem>
#include <optional>
#include <string>
#include <system_error>

#include "CommandLine.hpp"
#include "LogOutput.hpp"
#include "Output.hpp"
#include "ProgressLine.hpp"
#include "Session.hpp"
#include "failures.hpp"
#include "lineArguments.hpp"
#include "logFailures.hpp"
#include "texts.hpp"
#include "wayOut.hpp"

namespace vclink::shell
{
namespace
{

void enterFolder(const std::string &folder)
{
    std::error_code error;
    std::filesystem::current_path(folder, error);
    if (error)
    {
        throw ShellFailure(say("The folder %1% can't be entered: %2%.", folder, error.message()));
    }
}

bool isProgressShown(Progress progress)
{
    return progress == Progress::Always ||
           (progress == Progress::WhereSeen && errorsCanBeRedrawn());
}

/// A signal that asked the program to end decides its status, whatever became of the command.
ExitStatus runIn(Session &session, Command &command)
{
    try
    {
        const ExitStatus status = command.run(session);
        session.output().flush();
        return session.endingSignal() ? endedBy(*session.endingSignal()) : status;
    }
    catch (...)
    {
        const ExitStatus status = reportFailure();
        tellWayOut(session);
        return session.endingSignal() ? endedBy(*session.endingSignal()) : status;
    }
}

ExitStatus runCommand(const Settings &settings, Command &command, Output &output)
{
    std::error_code ignored;
    const std::filesystem::path start = std::filesystem::current_path(ignored);
    for (const std::string &folder : settings.folders)
    {
        // An empty one changes nothing, as with git.
        if (!folder.empty())
        {
            enterFolder(folder);
        }
    }
    surviveLogFailures();
    ProgressLine progressLine(isProgressShown(settings.progress));
    std::optional<LogOutput> log;
    if (settings.severities)
    {
        log.emplace(*settings.severities, progressLine);
    }
    Session session(output, progressLine, settings.takesAnyBare, start);
    return runIn(session, command);
}

ExitStatus run(int argc, const char *const *argv)
{
    try
    {
        const std::optional<std::string> locale = findLocale(argc, argv);
        if (locale && isLanguage(*locale))
        {
            setLanguage(*locale);
        }
        Output output;
        CommandLine line;
        const std::optional<ExitStatus> end = line.parse(argc, argv, output);
        return end ? *end : runCommand(line.settings(), line.command(), output);
    }
    catch (...)
    {
        return reportFailure();
    }
}

} // namespace
} // namespace vclink::shell

int main(int argc, char **argv)
{
    vclink::shell::holdStandardDescriptors();
    vclink::shell::surviveClosedPipes();
    return vclink::shell::run(argc, argv);
}
