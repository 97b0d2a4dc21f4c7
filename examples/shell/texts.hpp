// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>
#include <initializer_list>
#include <string>

namespace vclink::shell
{

/// A sentence of the program in its other languages. "%1%" is replaced by the first value, and so
/// on.
struct Translation
{
    const char *english;
    const char *german;
    const char *japanese;
};

/// Sets the language of the program and of the library's messages, by the name of a locale.
void setLanguage(const std::string &locale);

/// The language of the process's locale, e.g. "de".
std::string currentLanguage();

/// Whether the program speaks the language of a locale.
bool isLanguage(const std::string &locale);

/// A sentence in the language of the process's locale; in English if it has no other.
std::string say(const char *english);

/// A text with its placeholders filled in. A percent sign that is no placeholder stays.
std::string fill(const std::string &text, std::initializer_list<std::string> values);

/// As say(), filled in.
template <class... Values>
std::string say(const char *english, const std::string &first, const Values &...others)
{
    return fill(say(english), {first, std::string(others)...});
}

/// The one sentence or the other, with the number filled in.
std::string sayCount(std::size_t count, const char *one, const char *many);

} // namespace vclink::shell
