// SPDX-License-Identifier: MIT
#include "CommandLine.hpp"

#include <algorithm>
#include <string_view>

#include "Output.hpp"
#include "failures.hpp"
#include "severities.hpp"

namespace vclink::shell
{
namespace
{

// CLI11 takes the brackets off an argument and splits it at its commas, takes "++" for the end of a
// command's arguments, and reads nothing after "--" once it has seen the first of a list of paths.
// Such arguments are hidden from it behind a NUL, which no argument can hold, until they have found
// their option.
constexpr char hidingMark = '\0';

// Whatever follows it is its value.
constexpr const char *freeTextOption = "-m";

bool isMisread(std::string_view argument)
{
    return argument.substr(0, 1) == "[" || argument == "++";
}

/// The arguments in reverse order, as CLI11 reads them.
std::vector<std::string> readArguments(int argc, const char *const *argv)
{
    std::vector<std::string> arguments;
    bool optionsHaveEnded = false;
    for (int index = 1; index < argc; ++index)
    {
        const std::string argument = argv[index];
        if (!optionsHaveEnded && argument == freeTextOption && index + 1 < argc)
        {
            arguments.push_back(argument);
            arguments.push_back(hidingMark + std::string(argv[++index]));
            continue;
        }
        if (!optionsHaveEnded && argument == "--")
        {
            optionsHaveEnded = true;
            continue;
        }
        const bool isHidden = optionsHaveEnded || isMisread(argument);
        arguments.push_back(isHidden ? hidingMark + argument : argument);
    }
    std::reverse(arguments.begin(), arguments.end());
    return arguments;
}

std::string showHidden(std::string text)
{
    text.erase(std::remove(text.begin(), text.end(), hidingMark), text.end());
    return text;
}

void showHiddenValues(CLI::App &line)
{
    for (CLI::Option *option : line.get_options())
    {
        option->transform(CLI::Validator(
            [](std::string &value)
            {
                value = showHidden(std::move(value));
                return std::string();
            },
            ""));
    }
}

std::optional<Progress> parseProgress(const std::string &text)
{
    if (text == "auto")
    {
        return Progress::WhereSeen;
    }
    if (text == "always")
    {
        return Progress::Always;
    }
    return text == "never" ? std::optional(Progress::Never) : std::nullopt;
}

/// What is wrong with a line that has something too much.
std::string describeExtras(const CLI::App &line)
{
    const std::string first = '"' + showHidden(line.remaining(true).front()) + '"';
    return line.get_subcommands().empty() ? "There is no command or option " + first + "."
                                          : first + " was not expected.";
}

ExitStatus refuse(const std::string &reason)
{
    complain(reason + " --help tells how it is used.");
    return WrongUsage;
}

void setWords(CLI::FormatterBase &help)
{
    help.label("OPTIONS", "OPTION...");
    help.label("SUBCOMMAND", "COMMAND ...");
    help.label("Positionals", "Arguments");
    help.label("REQUIRED", "");
    help.column_width(24);
}

} // namespace

CommandLine::CommandLine()
    : line_(std::make_unique<CLI::App>("Shows and changes a Git working copy, as a desktop host "
                                       "does it through the vclink_git library.",
                                       "vclink-shell"))
{
    setWords(*line_->get_formatter());
    line_->set_help_flag("-h,--help", "Show this help");
    line_->footer(
        "vclink-shell COMMAND --help tells more of a command.\n\n"
        "Exit status: 0 done, 1 failed, 2 wrong usage, 128 and a signal's number stopped.");
    // A file may have the name of a command: only the first word is one.
    line_->require_subcommand(0, 1);
    declareSettings();
    showHiddenValues(*line_);
    declareCommands();
}

CommandLine::~CommandLine() = default;

void CommandLine::declareSettings()
{
    line_
        ->add_option_function<std::vector<std::string>>(
            "-C", [this](const std::vector<std::string> &folders) { settings_.folders = folders; },
            "Work as if started in FOLDER")
        ->type_name("FOLDER")
        ->option_text("FOLDER")
        ->allow_extra_args(false);
    line_
        ->add_option_function<std::string>(
            "--log",
            [this](const std::string &text)
            {
                settings_.severities = parseSeverities(text);
                if (!settings_.severities)
                {
                    throw CLI::ValidationError(
                        "--log",
                        "\"" + text +
                            "\" is neither a number nor a list of these names: " + severityNames());
                }
            },
            "Show the library's log on standard error: a number, or\nnames separated by commas: " +
                severityNames())
        ->type_name("SEVERITIES");
    line_
        ->add_option_function<std::string>(
            "--lang", [this](const std::string &locale) { settings_.locale = locale; },
            "Give error messages in the language of this locale, e.g. de")
        ->type_name("LOCALE");
    line_
        ->add_option_function<std::string>(
            "--progress",
            [this](const std::string &text)
            {
                const std::optional<Progress> progress = parseProgress(text);
                if (!progress)
                {
                    throw CLI::ValidationError("--progress",
                                               "\"" + text + "\" is not auto, always or never");
                }
                settings_.progress = *progress;
            },
            "Draw the progress of long operations on standard error: always,\nnever, or auto "
            "(if that is a terminal)")
        ->type_name("WHEN");
    line_->add_flag(
        "--bare", settings_.takesAnyBare,
        "Also work in a bare repository inside a working copy, whose\nconfiguration may "
        "have come with a clone");
}

void CommandLine::declareCommands()
{
    for (const CommandEntry &entry : commandTable())
    {
        CLI::App *line = line_->add_subcommand(entry.name, entry.summary);
        std::unique_ptr<Command> command = entry.make();
        line->group("Commands");
        command->declare(*line);
        showHiddenValues(*line);
        commands_.emplace_back(line, std::move(command));
    }
}

std::optional<ExitStatus> CommandLine::parse(int argc, const char *const *argv, Output &output)
{
    try
    {
        line_->parse(readArguments(argc, argv));
    }
    catch (const CLI::CallForHelp &)
    {
        // For the line of usage: a command is not optional.
        line_->require_subcommand(1);
        output.write(line_->help());
        output.flush();
        return Done;
    }
    catch (const CLI::ExtrasError &)
    {
        return refuse(describeExtras(*line_));
    }
    catch (const CLI::ParseError &error)
    {
        return refuse(std::string(error.what()) + ".");
    }
    for (const auto &[line, command] : commands_)
    {
        if (line->parsed())
        {
            chosen_ = command.get();
            return std::nullopt;
        }
    }
    return refuse("A command is missing.");
}

const Settings &CommandLine::settings() const noexcept
{
    return settings_;
}

Command &CommandLine::command() const noexcept
{
    return *chosen_;
}

} // namespace vclink::shell
