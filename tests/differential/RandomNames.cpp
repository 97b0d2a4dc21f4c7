// SPDX-License-Identifier: MIT
#include "RandomNames.hpp"

#include <iterator>

namespace vclink::test
{
namespace
{

using Forms = std::vector<std::string>;

/// A '%' becomes a digit, so that "a[%]" meets the names that it matches as a pattern.
const Forms usualFiles{"a%",   "a-%",    "a.%",     "file%.txt", "Makefile%", "%.c",
                       ".r%c", "read%.", "%.log",   "%~",        "ignored%",  "under_score%",
                       "a%b",  "A%",     "tmp%.sh", "data%.bin"};
const Forms unusualFiles{
    // blanks and line ends: inside, leading, trailing
    "a b%", " lead%", "trail% ", "in\tside%", "\ttab%", "tab%\t", "line\nfeed%", "%\n", "%\r",
    "carriage\r%", "\v%", "%\f", " % ",
    // what shells, patterns and configuration files read
    "it's%", "\"quoted%\"", "`%`", "$HOME%", "a;%", "&%", "a[%]", "[ab]%", "*%", "a*", "?%", "a?",
    "[", "{a,b}%", "back\\%", "\\#%", "%\\", "#%", "#%#", "!%", "!", "#", "~%", "-%", "--%", ":%",
    ":(top)%", "..%", "%..", "@%", "a=b%", "%%",
    // text outside ASCII: composed, decomposed, outside the first plane, with a byte order mark
    "\xC3\xBCmlaut%", "\xE6\x97\xA5\xE6\x9C\xAC%", "\xF0\x9D\x92\xB3%", "e\xCC\x81%",
    "\xEF\xBB\xBF%", "\xEF\xBF\xBD%",
    // bytes that are no UTF-8: stray, cut short, Latin-1, overlong, an encoded surrogate
    "\xFF%", "\x80%", "%\xE6\x97", "caf\xE9%", "\xC0\xAF%", "\xED\xA0\x80%",
    // control characters
    "\x01%", "%\x1F", "\x7F%", "\x1B[0m%"};
const Forms usualFolders{"src", "a", "dir%", "build", "tmp", "a-b", "lib.d", "deep"};
const Forms unusualFolders{"a b",  " d%",  "d% ",  "[d%]", "*",         "#d",          "!d",
                           "it's", "\\d%", "d\n%", "d\t",  "\xC3\xA4%", "\xFE%",       ".d%",
                           "-d%",  "d\r",  "a=%",  "~",    "\"",        "\xE6\x97\xA5"};

std::string makeName(Random &random, const Forms &usual, const Forms &unusual)
{
    std::string name;
    for (const char character : random.pick(random.chance(60) ? usual : unusual))
    {
        name += character == '%' ? static_cast<char>('0' + random.below(10)) : character;
    }
    return name;
}

std::string join(const std::string &folder, const std::string &name)
{
    return folder.empty() ? name : folder + '/' + name;
}

} // namespace

std::string RandomNames::fresh()
{
    return freshIn(random_.chance(70) ? someFolder() : freshFolder());
}

std::string RandomNames::freshIn(const std::string &folder)
{
    std::string path;
    // Names run out in a folder that many files are asked of: each refusal makes them longer.
    std::string suffix;
    do
    {
        path = join(folder, makeName(random_, usualFiles, unusualFiles) + suffix);
        suffix += 'x';
    } while (!isFree(path));
    take(path);
    return path;
}

std::string RandomNames::freshFolder()
{
    std::string folder = someFolder();
    do
    {
        folder = join(folder, makeName(random_, usualFolders, unusualFolders));
    } while (folders_.count(folder) != 0 || files_.count(folder) != 0);
    return folder;
}

std::string RandomNames::someFolder()
{
    const std::size_t index = random_.below(folders_.size() + 1);
    return index == folders_.size()
               ? std::string()
               : *std::next(folders_.begin(), static_cast<std::ptrdiff_t>(index));
}

bool RandomNames::isFree(const std::string &path) const
{
    if (files_.count(path) != 0 || folders_.count(path) != 0)
    {
        return false;
    }
    for (std::size_t slash = path.find('/'); slash != std::string::npos;
         slash = path.find('/', slash + 1))
    {
        if (files_.count(path.substr(0, slash)) != 0)
        {
            return false;
        }
    }
    return true;
}

void RandomNames::take(const std::string &path)
{
    files_.insert(path);
    for (std::size_t slash = path.find('/'); slash != std::string::npos;
         slash = path.find('/', slash + 1))
    {
        folders_.insert(path.substr(0, slash));
    }
}

} // namespace vclink::test
