// SPDX-License-Identifier: MIT
#include "historyText.hpp"

#include <algorithm>
#include <iterator>

namespace vclink::test
{
namespace
{

constexpr std::size_t fewestLines = 20;
constexpr std::size_t mostLines = 60;
constexpr std::size_t recordLength = 32;
constexpr std::size_t blockLength = 6;

std::string makeWord(Random &random)
{
    std::string word;
    for (std::size_t length = 4 + random.below(6); length > 0; --length)
    {
        word += static_cast<char>('a' + random.below(26));
    }
    return word;
}

std::string makeLine(Random &random)
{
    switch (random.below(10))
    {
    case 0:
        return "\n";
    case 1:
        return "}\n";
    case 2:
        return "    return 0;\n";
    default:
        return makeUniqueLine(random);
    }
}

using Place = Lines::difference_type;

} // namespace

Lines splitLines(const std::string &text)
{
    Lines lines;
    for (std::size_t begin = 0; begin < text.size();)
    {
        const auto end = std::min(text.find('\n', begin), text.size() - 1) + 1;
        lines.push_back(text.substr(begin, end - begin));
        begin = end;
    }
    return lines;
}

std::string joinLines(const Lines &lines)
{
    std::string text;
    for (const auto &line : lines)
    {
        text += line;
    }
    return text;
}

std::string makeUniqueLine(Random &random)
{
    // Each in a statement of its own: the order within an expression is the compiler's affair.
    const std::string argument = makeWord(random);
    const std::string function = makeWord(random);
    const std::string result = makeWord(random);
    return "    " + result + " = " + function + '(' + argument + ");\n";
}

std::string makeText(Random &random)
{
    std::string text;
    for (auto count = fewestLines + random.below(mostLines - fewestLines + 1); count > 0; --count)
    {
        text += makeLine(random);
    }
    return text;
}

std::string makeBinary(Random &random)
{
    std::string content;
    for (auto records = 8 + random.below(24); records > 0; --records)
    {
        for (std::size_t length = recordLength; length > 1; --length)
        {
            content += static_cast<char>(random.below(256));
        }
        content += '\0';
    }
    return content;
}

std::string editBinary(Random &random, std::string content)
{
    const auto record = random.below(content.size() / recordLength);
    char &byte = content[record * recordLength + random.below(recordLength - 1)];
    byte = static_cast<char>(byte + 1);
    return content;
}

Stretch thirdOf(const std::string &text, std::size_t number)
{
    const auto lines = splitLines(text).size();
    return {number * lines / 3 + 1, (number + 1) * lines / 3 - 1};
}

std::string editText(Random &random, const std::string &text, Stretch stretch)
{
    Lines lines = splitLines(text);
    const auto place = stretch.begin + random.below(stretch.end - stretch.begin);
    const auto most = std::min<std::size_t>(3, stretch.end - place);
    const auto removed =
        lines.size() > fewestLines + 3 && random.chance(65) ? 1 + random.below(most) : 0;
    const bool inserts = lines.size() < mostLines - 3 && (removed == 0 || random.chance(70));
    Lines inserted(inserts || removed == 0 ? 1 + random.below(3) : 0);
    std::generate(inserted.begin(), inserted.end(), [&random] { return makeUniqueLine(random); });
    const auto at = lines.begin() + static_cast<Place>(place);
    const auto next = lines.erase(at, at + static_cast<Place>(removed));
    lines.insert(next, inserted.begin(), inserted.end());
    return joinLines(lines);
}

std::string replaceLine(const std::string &text, std::size_t number, const std::string &line)
{
    Lines lines = splitLines(text);
    lines.at(number) = line;
    return joinLines(lines);
}

std::string insertLine(const std::string &text, std::size_t number, const std::string &line)
{
    Lines lines = splitLines(text);
    lines.insert(lines.begin() + static_cast<Place>(number), line);
    return joinLines(lines);
}

std::string moveBlock(Random &random, const std::string &text)
{
    Lines lines = splitLines(text);
    const auto begin = lines.begin() + static_cast<Place>(random.below(lines.size() / 2 - 2));
    std::rotate(begin, begin + static_cast<Place>(blockLength), lines.end());
    return joinLines(lines);
}

} // namespace vclink::test
