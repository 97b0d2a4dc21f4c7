// SPDX-License-Identifier: MIT
#include "lineArguments.hpp"

#include <algorithm>
#include <string_view>
#include <utility>

namespace vclink::shell
{
namespace
{

// CLI11 takes the brackets off an argument and splits it at its commas, takes "++" for the end of a
// command's arguments, and reads nothing after "--" once it has seen the first of a list of paths.
// Such arguments are hidden from it behind a NUL, which no argument can hold, until they have found
// their option.
constexpr char hidingMark = '\0';

/// Whether whatever follows is a text of its own: "-m", also behind other letters.
bool takesFreeText(std::string_view argument)
{
    return argument.size() > 1 && argument[0] == '-' && argument[1] != '-' &&
           argument.find('m') == argument.size() - 1;
}

bool isMisread(std::string_view argument)
{
    return argument.substr(0, 1) == "[" || argument == "++";
}

} // namespace

std::vector<std::string> readArguments(int argc, const char *const *argv)
{
    std::vector<std::string> arguments;
    bool optionsHaveEnded = false;
    for (int index = 1; index < argc; ++index)
    {
        const std::string argument = argv[index];
        if (!optionsHaveEnded && takesFreeText(argument) && index + 1 < argc)
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

std::optional<std::string> findLocale(int argc, const char *const *argv)
{
    constexpr std::string_view withValue = "--lang=";
    std::optional<std::string> locale;
    for (int index = 1; index < argc; ++index)
    {
        const std::string_view argument = argv[index];
        const bool hasNext = index + 1 < argc;
        if (argument.substr(0, withValue.size()) == withValue)
        {
            locale = std::string(argument.substr(withValue.size()));
        }
        else if (argument == "--lang" && hasNext)
        {
            locale = argv[++index];
        }
        else if (argument == "-C" || argument == "--log" || argument == "--progress")
        {
            ++index;
        }
        else if (argument.substr(0, 1) != "-" || argument == "--")
        {
            break;
        }
    }
    return locale;
}

} // namespace vclink::shell
