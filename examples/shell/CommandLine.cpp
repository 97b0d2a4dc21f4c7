// SPDX-License-Identifier: MIT
#include "CommandLine.hpp"

#include "Output.hpp"
#include "arguments.hpp"
#include "commands.hpp"
#include "failures.hpp"
#include "lineArguments.hpp"
#include "severities.hpp"
#include "suggestions.hpp"
#include "texts.hpp"

namespace vclink::shell
{
namespace
{

constexpr const char *program = "vclink-shell";

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

/// An option as it is typed: "-m MESSAGE", or "PATH" for one that is known by its place.
std::string labelOf(const CLI::Option &option)
{
    const std::string name = option.get_name();
    return option.get_positional() ? name : name + ' ' + option.get_type_name();
}

std::vector<std::string> optionsOf(const CLI::App &line)
{
    std::vector<std::string> names;
    for (const CLI::Option *option : line.get_options())
    {
        for (const std::string &name : option->get_lnames())
        {
            names.push_back("--" + name);
        }
    }
    return names;
}

void setWords(CLI::App &line)
{
    const std::shared_ptr<CLI::FormatterBase> help = line.get_formatter();
    help->label("Usage", say("Usage"));
    help->label("OPTIONS", say("OPTION..."));
    help->label("SUBCOMMAND", say("COMMAND ..."));
    help->label("Positionals", say("Arguments"));
    help->label("REQUIRED", "");
    help->column_width(24);
}

void setGroup(CLI::App &line)
{
    for (CLI::Option *option : line.get_options())
    {
        if (!option->get_positional())
        {
            option->group(say("Options"));
        }
    }
}

std::string describeUnknown(const std::string &command)
{
    return say("Unknown command '%1%'.", command) + suggestCommand(command);
}

} // namespace

CommandLine::CommandLine()
    : line_(std::make_unique<CLI::App>(say("Shows and changes a Git working copy, as a desktop "
                                           "host does it through the vclink_git library."),
                                       program))
{
    setWords(*line_);
    line_->set_help_flag("-h,--help", say("Show this help"));
    line_->set_version_flag("--version", versionText, say("Show the versions, as version does"));
    line_->footer(say("\"vclink-shell help COMMAND\" describes a command.\n\nExit status: 0 done, "
                      "1 failed, 2 wrong usage, 128 plus a signal's number if that stopped it."));
    // A file may have the name of a command: only the first word is one.
    line_->require_subcommand(0, 1);
    declareSettings();
    showHiddenValues(*line_);
    setGroup(*line_);
    declareCommands();
}

CommandLine::~CommandLine() = default;

void CommandLine::declareSettings()
{
    line_
        ->add_option_function<std::vector<std::string>>(
            "-C", [this](const std::vector<std::string> &folders) { settings_.folders = folders; },
            say("Work as if started in FOLDER"))
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
                        "--log", say("\"%1%\" is neither a number nor a list of these names: %2%",
                                     text, severityNames()));
                }
            },
            say("Show the library's log on standard error: a number, or\nnames separated by "
                "commas: %1%",
                severityNames()))
        ->type_name("SEVERITIES");
    // Read before the line is, see findLocale().
    line_
        ->add_option_function<std::string>(
            "--lang",
            [](const std::string &locale)
            {
                if (!isLanguage(locale))
                {
                    throw CLI::ValidationError(
                        "--lang", say("\"%1%\" is none of the languages en, de and ja", locale));
                }
            },
            say("Use the language of this locale: en, de or ja"))
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
                                               say("\"%1%\" is not auto, always or never", text));
                }
                settings_.progress = *progress;
            },
            say("Draw the progress of long operations on standard error: always,\nnever, or auto "
                "(if that is a terminal)"))
        ->type_name("WHEN");
    line_->add_flag("--bare", settings_.takesAnyBare,
                    say("Also work in a bare repository inside a working copy. Its "
                        "configuration\nmay have come with a clone, and can run commands"));
}

void CommandLine::declareCommands()
{
    const auto add = [this](const char *name, const std::string &summary)
    {
        CLI::App *line = line_->add_subcommand(name, summary);
        line->set_help_flag("-h,--help", say("Show this help"));
        line->group(say("Commands"));
        return line;
    };
    for (const CommandEntry &entry : commandTable())
    {
        CLI::App *line = add(entry.name, say(entry.summary));
        std::unique_ptr<Command> command = entry.make();
        command->declare(*line);
        showHiddenValues(*line);
        setGroup(*line);
        commands_.emplace_back(line, std::move(command));
    }
    help_ = add("help", say("Show the help of a command"));
    declareName(*help_, "COMMAND", say("The command; without it, all commands"));
    setGroup(*help_);
}

std::optional<ExitStatus> CommandLine::parse(int argc, const char *const *argv, Output &output)
{
    try
    {
        line_->parse(readArguments(argc, argv));
    }
    catch (const CLI::CallForHelp &)
    {
        const CLI::App *const line = parsedCommand();
        return help(line == nullptr ? "" : line->get_name(), output);
    }
    catch (const CLI::CallForVersion &)
    {
        output.write(versionText());
        output.flush();
        return Done;
    }
    catch (const CLI::ParseError &error)
    {
        return refuse(describe(error));
    }
    if (help_->parsed())
    {
        const std::vector<std::string> names = help_->get_option("COMMAND")->results();
        return help(names.empty() ? "" : names.front(), output);
    }
    for (const auto &[line, command] : commands_)
    {
        if (line->parsed())
        {
            chosen_ = command.get();
            return std::nullopt;
        }
    }
    return refuse(say("A command is missing."));
}

std::optional<ExitStatus> CommandLine::help(const std::string &command, Output &output) const
{
    std::string text;
    if (command.empty())
    {
        // For the line of usage: a command is not optional.
        line_->require_subcommand(1);
        text = line_->get_formatter()->make_help(line_.get(), program, CLI::AppFormatMode::Normal);
    }
    for (const CLI::App *line : line_->get_subcommands({}))
    {
        if (line->get_name() == command)
        {
            text = line->help(program);
        }
    }
    if (text.empty())
    {
        const std::string word = showHidden(command);
        complain(describeUnknown(word) + '\n' +
                 say("See \"%1%\".", std::string(program) + " help"));
        return WrongUsage;
    }
    output.write(text);
    output.flush();
    return Done;
}

const CLI::App *CommandLine::parsedCommand() const
{
    const std::vector<CLI::App *> parsed = line_->get_subcommands();
    return parsed.empty() ? nullptr : parsed.front();
}

std::string CommandLine::describe(const CLI::ParseError &error) const
{
    // What is not known comes first: it may be why something else is missing.
    std::string extra = describeExtra();
    if (!extra.empty())
    {
        return extra;
    }
    const std::string text = error.what();
    const std::string name = text.substr(0, text.find(':'));
    if (dynamic_cast<const CLI::RequiredError *>(&error) != nullptr)
    {
        return describeMissing(text.substr(0, text.find(" is required")));
    }
    if (dynamic_cast<const CLI::ArgumentMismatch *>(&error) != nullptr)
    {
        return text.find("At Most") == std::string::npos ? say("%1% needs a value.", name)
                                                         : say("%1% can be given only once.", name);
    }
    return say("%1%.", text);
}

std::string CommandLine::describeExtra() const
{
    const std::vector<std::string> extras = line_->remaining(true);
    if (extras.empty())
    {
        return {};
    }
    const CLI::App *const command = parsedCommand();
    const std::string &first = extras.front();
    if (first.size() > 1 && first.front() == '-')
    {
        const std::string instead =
            command == nullptr ? "" : suggestInstead(command->get_name(), first);
        std::string place = describePlace(command, first);
        if (!place.empty())
        {
            return place;
        }
        return say("Unknown option '%1%'.", first) +
               (instead.empty() ? suggest(first, optionsOf(command == nullptr ? *line_ : *command))
                                : instead);
    }
    const std::string word = showHidden(first);
    return command == nullptr
               ? describeUnknown(word)
               : say("Unexpected argument '%1%'.", word) + suggestInstead(command->get_name(), "");
}

std::string CommandLine::describePlace(const CLI::App *command, const std::string &option) const
{
    if (command == nullptr)
    {
        return {};
    }
    const auto has = [&option](const CLI::App &line)
    { return line.get_option_no_throw(option) != nullptr; };
    if (has(*command))
    {
        return say("The option '%1%' must follow the command.", option);
    }
    return has(*line_) ? say("The option '%1%' must be before the command.", option)
                       : std::string();
}

std::string CommandLine::describeMissing(const std::string &name) const
{
    const CLI::App *const command = parsedCommand();
    const CLI::Option *const option =
        (command == nullptr ? line_.get() : command)->get_option_no_throw(name);
    return say("%1% is missing.", option == nullptr ? name : labelOf(*option));
}

ExitStatus CommandLine::refuse(const std::string &reason) const
{
    const CLI::App *const command = parsedCommand();
    const std::string page =
        std::string(program) + " help" + (command == nullptr ? "" : ' ' + command->get_name());
    complain(reason + '\n' + say("See \"%1%\".", page));
    return WrongUsage;
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
