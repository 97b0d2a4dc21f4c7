// SPDX-License-Identifier: MIT
#include "RandomContent.hpp"

#include <algorithm>

namespace vclink::test
{
namespace
{

constexpr std::size_t fewestRandomLines = 6;

std::string makeLetters(Random &random)
{
    std::string line;
    for (std::size_t length = 12 + random.below(8); length > 0; --length)
    {
        line += static_cast<char>('a' + random.below(26));
    }
    return line;
}

std::string makeLines(Random &random, const char *lineEnd)
{
    std::string text;
    for (std::size_t count = fewestRandomLines + random.below(8); count > 0; --count)
    {
        text += makeLetters(random) + lineEnd;
    }
    return text;
}

} // namespace

std::string makeContent(Random &random)
{
    switch (random.below(20))
    {
    case 0:
        return {};
    case 1:
        return makeLetters(random);
    case 2:
        return makeLines(random, "\r\n");
    case 3:
        return makeLetters(random) + '\0' + '\xFF' + makeLetters(random);
    default:
        return makeLines(random, "\n");
    }
}

std::string makeSimilar(Random &random, const std::string &content)
{
    const auto lines = std::count(content.begin(), content.end(), '\n');
    if (static_cast<std::size_t>(lines) < fewestRandomLines)
    {
        return makeContent(random);
    }
    std::size_t begin = 0;
    for (auto skipped = random.below(static_cast<std::size_t>(lines)); skipped > 0; --skipped)
    {
        begin = content.find('\n', begin) + 1;
    }
    std::string similar = content;
    return similar.replace(begin, content.find('\n', begin) - begin, makeLetters(random));
}

std::string makeSameSize(Random &random, const std::string &content)
{
    if (content.empty())
    {
        return makeContent(random);
    }
    std::string other = content;
    char &byte = other[random.below(other.size())];
    byte = byte == 'A' ? 'B' : 'A';
    return other;
}

std::string makeIgnoreRules(Random &random)
{
    // A rule that takes names back in holds for no folder: there libgit2 differs from git.
    static const std::vector<std::string> rules{
        "*.log",  "ignored*", "build/",     "/tmp/",     "!ignored5*", "*~",
        "src/a*", "**/deep",  "deep/**",    "\\#*",      "\\!*",       "a b*",
        "*.c",    "!*1.c",    "*\xC3\xBC*", "[ab]*.txt", "\xFF*",      "/a",
        "dir?/",  "a/*",      "*",          "data*.bin"};
    std::string text = "# " + makeLetters(random) + "\n\n";
    for (std::size_t count = 1 + random.below(5); count > 0; --count)
    {
        text += random.pick(rules) + '\n';
    }
    return text;
}

std::string makeConflictMarkers(Random &random)
{
    return "<<<<<<< ours\n" + makeLetters(random) + "\n=======\n" + makeLetters(random) +
           "\n>>>>>>> theirs\n";
}

} // namespace vclink::test
