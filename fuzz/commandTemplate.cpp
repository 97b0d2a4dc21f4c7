// SPDX-License-Identifier: MIT
// The command of a merge driver: its expansion, and what may be handed to Boost.Process of it,
// which splits it into words. Input, cut at NULs: template, "%A", "%B", "%O", "%P".
#include <algorithm>
#include <map>

// As where the library runs commands.
#if __has_include(<boost/process/v1/detail/posix/basic_cmd.hpp>)
#define BOOST_PROCESS_VERSION 1
#include <boost/process/v1/detail/posix/basic_cmd.hpp>
#else
#include <boost/process/detail/posix/basic_cmd.hpp>
#endif

#include "check.hpp"
#include "util/command/commandLine.hpp"

using vclink::fuzz::require;

namespace
{

using Words = std::vector<std::string>;

std::string replaceEach(const std::string &text, const std::string &placeholder,
                        const std::string &value)
{
    std::string replaced;
    for (std::size_t i = 0; i < text.size();)
    {
        const bool isPlaceholder = text.compare(i, placeholder.size(), placeholder) == 0;
        replaced += isPlaceholder ? value : text.substr(i, 1);
        i += isPlaceholder ? placeholder.size() : 1;
    }
    return replaced;
}

std::string expandPlainly(std::string text, const std::map<std::string, std::string> &placeholders)
{
    for (const auto &[placeholder, value] : placeholders)
        text = replaceEach(text, placeholder, value);
    return text;
}

/// The words with their quotes.
Words splitPlainly(const std::string &command)
{
    Words words{""};
    bool isQuoted = false;
    for (const char character : command)
    {
        isQuoted = isQuoted != (character == '"');
        if (character == ' ' && !isQuoted)
            words.emplace_back();
        else
            words.back() += character;
    }
    Words kept;
    for (const auto &word : words)
    {
        if (!word.empty())
            kept.push_back(word);
    }
    return kept;
}

/// A word as the command gets it.
std::string stripPlainly(const std::string &word)
{
    const bool isEnclosed = word.size() > 1 && word.front() == '"' && word.back() == '"';
    return replaceEach(isEnclosed ? word.substr(1, word.size() - 2) : word, "\\\"", "\"");
}

/// How much longer the expansion may be than its parts: placeholders within values multiply, and a
/// few lines of them are enough to fill the memory.
std::size_t growth(const Words &pieces)
{
    std::size_t growth = 1;
    for (const auto &piece : pieces)
        growth *= 1 + static_cast<std::size_t>(std::count(piece.begin(), piece.end(), '%'));
    return growth;
}

void checkSplit(const std::string &command)
{
    Words words = splitPlainly(command);
    const bool isUsable = !words.empty() && words.back() != "\"";
    const char *const fault = vclink::git::findCommandFault(command);
    require(isUsable == (fault == nullptr), "a command is refused when it can't be split, only");
    if (isUsable)
    {
        for (auto &word : words)
            word = stripPlainly(word);
        require(boost::process::detail::posix::build_args(command) == words,
                "a command that is not refused is split into its words");
        require(vclink::git::findFirstWord(command).text == words.front(),
                "the first of them is the one that is looked up");
    }
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t *data, std::size_t size)
{
    const auto pieces = vclink::fuzz::cut(vclink::fuzz::bytesOf(data, size), '\0', 5);
    const std::map<std::string, std::string> placeholders{
        {"%A", pieces[1]}, {"%B", pieces[2]}, {"%L", "7"}, {"%O", pieces[3]}, {"%P", pieces[4]}};
    if (growth(pieces) > 10000)
        return -1;
    const auto command = vclink::git::expandPlaceholders(pieces[0], placeholders);
    require(command == expandPlainly(pieces[0], placeholders),
            "every placeholder is replaced, one after the other");
    checkSplit(command);
    return 0;
}
