// SPDX-License-Identifier: MIT
#include "util/command/commandLine.hpp"

#include <cstddef>
#include <utility>

#include <boost/algorithm/string/replace.hpp>
#include <unistd.h>

namespace vclink::git
{
namespace
{

constexpr char blank = ' ';
constexpr char quote = '"';

/// Returns the start of the last word: after the last blank outside double quotes.
std::size_t findLastWord(const std::string &command) noexcept
{
    std::size_t begin = 0;
    bool isQuoted = false;
    for (std::size_t i = 0; i < command.size(); ++i)
    {
        if (command[i] == quote)
        {
            isQuoted = !isQuoted;
        }
        else if (command[i] == blank && !isQuoted)
        {
            begin = i + 1;
        }
    }
    return begin;
}

} // namespace

std::string expandPlaceholders(const std::string &commandTemplate,
                               const std::map<std::string, std::string> &placeholders)
{
    std::string command = commandTemplate;
    for (const auto &[placeholder, value] : placeholders)
    {
        boost::algorithm::replace_all(command, placeholder, value);
    }
    return command;
}

const char *findCommandFault(const std::string &command) noexcept
{
    if (command.find_first_not_of(blank) == std::string::npos)
    {
        return "the command is empty";
    }
    // It can only be the last word, because an open quote includes everything that follows.
    if (command.back() == quote && findLastWord(command) == command.size() - 1)
    {
        return "a double quote of the command is not closed";
    }
    if (environ == nullptr || *environ == nullptr)
    {
        return "the environment is empty";
    }
    return nullptr;
}

CommandWord findFirstWord(const std::string &command)
{
    const std::size_t begin = command.find_first_not_of(blank);
    bool isQuoted = false;
    std::size_t end = begin;
    for (; end < command.size() && (isQuoted || command[end] != blank); ++end)
    {
        isQuoted = isQuoted != (command[end] == quote);
    }
    std::string text = command.substr(begin, end - begin);
    if (text.front() == quote && text.back() == quote)
    {
        text = text.substr(1, text.size() - 2);
    }
    boost::algorithm::replace_all(text, "\\\"", "\"");
    return {begin, end - begin, std::move(text)};
}

} // namespace vclink::git
