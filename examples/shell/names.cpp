// SPDX-License-Identifier: MIT
#include "names.hpp"

#include <algorithm>
#include <array>
#include <cstdio>
#include <string_view>
#include <system_error>

#include "failures.hpp"
#include "fl/i18n/convert.hpp"
#include "texts.hpp"

namespace vclink::shell
{
namespace
{

bool isBetween(char16_t unit, char16_t first, char16_t last)
{
    return unit >= first && unit <= last;
}

/// C0, DEL and C1, all of which terminals may obey.
bool isControl(char16_t unit)
{
    return unit < 0x20 || isBetween(unit, 0x7F, 0x9F);
}

void appendOctal(ustring &text, unsigned byte)
{
    std::array<char, 8> digits{};
    const int count = std::snprintf(digits.data(), digits.size(), "\\%03o", byte);
    text.append(digits.data(), digits.data() + count);
}

void appendControl(ustring &text, char16_t unit)
{
    constexpr std::u16string_view letters = u"abtnvfr";
    if (isBetween(unit, u'\a', u'\r'))
    {
        text += u'\\';
        text += letters[static_cast<std::size_t>(unit - u'\a')];
        return;
    }
    if (unit > 0x7F)
    {
        appendOctal(text, 0xC2);
    }
    appendOctal(text, unit);
}

/// Each escape makes the text longer.
/// @param kept control characters that stay
/// @param special further characters that get a backslash
ustring escape(const ustring &text, std::u16string_view kept, std::u16string_view special)
{
    ustring escaped;
    escaped.reserve(text.size() + 2);
    for (std::size_t index = 0; index < text.size(); ++index)
    {
        const char16_t unit = text[index];
        const bool pairs = isBetween(unit, 0xD800, 0xDBFF) && index + 1 < text.size() &&
                           isBetween(text[index + 1], 0xDC00, 0xDFFF);
        if (pairs)
        {
            escaped.append(text, index, 2);
            ++index;
        }
        else if (isBetween(unit, 0xDC80, 0xDCFF))
        {
            // How the host's text holds a byte that is not UTF-8.
            appendOctal(escaped, unit & 0xFFU);
        }
        else if (isControl(unit) && kept.find(unit) == std::u16string_view::npos)
        {
            appendControl(escaped, unit);
        }
        else
        {
            if (special.find(unit) != std::u16string_view::npos)
            {
                escaped += u'\\';
            }
            escaped += unit;
        }
    }
    return escaped;
}

/// Marks, embeddings, overrides and isolates of bidirectional text.
bool changesDirection(char16_t unit)
{
    return unit == 0x061C || isBetween(unit, 0x200E, 0x200F) || isBetween(unit, 0x202A, 0x202E) ||
           isBetween(unit, 0x2066, 0x2069);
}

} // namespace

std::filesystem::path currentFolder()
{
    std::error_code error;
    std::filesystem::path folder = std::filesystem::current_path(error);
    if (error)
    {
        throw ShellFailure(say("The current folder can't be found: %1%.", error.message()));
    }
    return folder;
}

std::filesystem::path resolveArgument(const std::string &argument)
{
    std::string name = argument;
    while (name.size() > 1 && name.back() == '/')
    {
        name.pop_back();
    }
    return currentFolder() / name;
}

upath makePath(const std::filesystem::path &path)
{
    return upath(fl::i18n::utf8_to_ustring(path.string()));
}

std::filesystem::path nativePath(const upath &path)
{
    return fl::i18n::ustring_to_utf8(path.string());
}

ustring relativeName(const upath &path, const upath &root)
{
    const ustring &text = path.string();
    std::size_t start = root.string().size();
    while (start < text.size() && text[start] == u'/')
    {
        ++start;
    }
    return text.substr(start);
}

bool liesIn(const ustring &path, const ustring &folder)
{
    return path == folder || (path.size() > folder.size() && path[folder.size()] == u'/' &&
                              path.compare(0, folder.size(), folder) == 0);
}

upath canonicalForm(const upath &path)
{
    return makePath(std::filesystem::weakly_canonical(nativePath(path)));
}

ustring wayTo(const upath &path, const ustring &folder)
{
    const ustring &text = path.string();
    return text != folder && liesIn(text, folder)
               ? text.substr(folder.size() + 1)
               : makePath(nativePath(path).lexically_relative(nativePath(upath(folder)))).string();
}

std::string showPath(const upath &path)
{
    return quoteName(wayTo(path, makePath(currentFolder()).string()));
}

std::string quoteName(const ustring &name)
{
    const ustring escaped = escape(name, u"", u"\"\\");
    std::string text = fl::i18n::ustring_to_utf8(escaped);
    const bool isPlain =
        escaped.size() == name.size() && std::none_of(name.begin(), name.end(), changesDirection);
    return isPlain ? text : '"' + text + '"';
}

std::string quoteForShell(const std::string &word)
{
    constexpr std::string_view plain = "abcdefghijklmnopqrstuvwxyzABCDEFGHIJKLMNOPQRSTUVWXYZ"
                                       "0123456789-_./:@%+,=";
    if (!word.empty() && word.find_first_not_of(plain) == std::string::npos)
    {
        return word;
    }
    // What is escaped in a message would be another name, except in this kind of quotes.
    const ustring text = fl::i18n::utf8_to_ustring(word);
    const bool isShown = escape(text, u"", u"").size() == text.size() &&
                         std::none_of(text.begin(), text.end(), changesDirection);
    std::string quoted = isShown ? "'" : "$'";
    for (const char letter : word)
    {
        if (isShown)
        {
            quoted += letter == '\'' ? "'\\''" : std::string(1, letter);
            continue;
        }
        std::array<char, 8> escaped{letter};
        if (letter <= ' ' || letter == '\'' || letter == '\\' || letter == '\x7F')
        {
            std::snprintf(escaped.data(), escaped.size(), "\\%03o",
                          static_cast<unsigned>(static_cast<unsigned char>(letter)));
        }
        quoted += escaped.data();
    }
    return quoted + '\'';
}

std::string makePrintable(const ustring &text)
{
    return fl::i18n::ustring_to_utf8(escape(text, u"\n\t", u""));
}

std::string makePrintableLine(const ustring &text)
{
    return fl::i18n::ustring_to_utf8(escape(text, u"", u""));
}

std::string showName(const std::string &name)
{
    return makePrintableLine(fl::i18n::utf8_to_ustring(name));
}

std::string escapeDirections(const std::string &text)
{
    ustring escaped;
    for (const char16_t unit : fl::i18n::utf8_to_ustring(text))
    {
        if (!changesDirection(unit))
        {
            escaped += unit;
            continue;
        }
        for (const char byte : fl::i18n::ustring_to_utf8(ustring(1, unit)))
        {
            appendOctal(escaped, static_cast<unsigned char>(byte));
        }
    }
    return fl::i18n::ustring_to_utf8(escaped);
}

} // namespace vclink::shell
