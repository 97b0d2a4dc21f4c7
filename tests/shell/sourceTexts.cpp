// SPDX-License-Identifier: MIT
#include "sourceTexts.hpp"

#include <cctype>
#include <string_view>
#include <vector>

#include "support/readFile.hpp"

namespace vclink::test
{
namespace
{

/// A text, a word, or a single other character.
struct Token
{
    bool isText;
    std::string content;
};

char meaningOf(char escape)
{
    constexpr std::string_view letters = "abtnvfr";
    const std::size_t index = letters.find(escape);
    return index == std::string_view::npos ? escape : static_cast<char>('\a' + index);
}

bool isWordLetter(char letter)
{
    return std::isalnum(static_cast<unsigned char>(letter)) != 0 || letter == '_';
}

/// Takes a text or a character in quotes from the front.
std::string takeQuoted(std::string_view &code)
{
    const char quote = code.front();
    code.remove_prefix(1);
    std::string content;
    while (!code.empty() && code.front() != quote)
    {
        const bool isEscape = code.front() == '\\' && code.size() > 1;
        code.remove_prefix(isEscape ? 1 : 0);
        content += isEscape ? meaningOf(code.front()) : code.front();
        code.remove_prefix(1);
    }
    code.remove_prefix(code.empty() ? 0 : 1);
    return content;
}

std::string takeWord(std::string_view &code)
{
    std::size_t end = 0;
    // With the separators of a number's digits.
    while (end < code.size() && (isWordLetter(code[end]) ||
                                 (code[end] == '\'' && end > 0 && std::isdigit(code[0]) != 0)))
        ++end;
    std::string word(code.substr(0, end));
    code.remove_prefix(end);
    return word;
}

std::vector<Token> tokenize(std::string_view code)
{
    std::vector<Token> tokens;
    while (!code.empty())
    {
        if (code.substr(0, 2) == "//")
            code.remove_prefix(std::min(code.find('\n'), code.size()));
        else if (code.front() == '"')
        {
            const std::string text = takeQuoted(code);
            // Texts in a row are one.
            if (!tokens.empty() && tokens.back().isText)
                tokens.back().content += text;
            else
                tokens.push_back({true, text});
        }
        else if (code.front() == '\'')
            takeQuoted(code);
        else if (isWordLetter(code.front()))
            tokens.push_back({false, takeWord(code)});
        else
        {
            if (std::isspace(static_cast<unsigned char>(code.front())) == 0)
                tokens.push_back({false, std::string(1, code.front())});
            code.remove_prefix(1);
        }
    }
    return tokens;
}

void collect(const std::vector<Token> &tokens, SourceTexts &texts)
{
    int depth = 0;
    bool isSaid = false;
    bool isCount = false;
    for (std::size_t index = 0; index < tokens.size(); ++index)
    {
        const auto &[isText, content] = tokens[index];
        const bool isCall =
            !isText && index + 1 < tokens.size() && tokens[index + 1].content == "(";
        if (isCall && (content == "say" || content == "sayCount"))
        {
            isSaid = true;
            isCount = content == "sayCount";
            depth = 0;
        }
        else if (isText)
            (isSaid ? texts.said : texts.others).insert(content);
        else if (isSaid && content == "(")
            ++depth;
        else if (isSaid && content == ")")
            isSaid = --depth > 0;
        // What follows is filled in.
        else if (isSaid && content == "," && depth == 1)
            isSaid = isCount;
    }
}

} // namespace

SourceTexts readSourceTexts(const std::filesystem::path &folder)
{
    SourceTexts texts;
    for (const auto &entry : std::filesystem::directory_iterator(folder))
    {
        const std::string name = entry.path().filename().string();
        const bool isTable = name.find("Texts.cpp") != std::string::npos;
        const std::string extension = entry.path().extension().string();
        if (isTable || (extension != ".cpp" && extension != ".hpp"))
            continue;
        collect(tokenize(readFile(entry.path())), texts);
    }
    return texts;
}

} // namespace vclink::test
