// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <string>

#include "fl/filesystem/path.hpp"
#include "fl/ustring.hpp"

namespace vclink::shell
{

/// The current folder, absolute and free of symbolic links.
/// @throws ShellFailure when there is none any more
std::filesystem::path currentFolder();

/// A name as the person gave it, made absolute from the current folder, without slashes at its end.
/// Its bytes stay as they are.
std::filesystem::path resolveArgument(const std::string &argument);

/// A path as the host's value. Its bytes stay as they are.
upath makePath(const std::filesystem::path &path);

/// A path of the host's as the system's.
std::filesystem::path nativePath(const upath &path);

/// The path from `root` to `path`, which lies below it.
ustring relativeName(const upath &path, const upath &root);

/// Whether a path is that of the folder or lies below it; both free of symbolic links.
bool liesIn(const ustring &path, const ustring &folder);

/// Free of symbolic links, which the back end follows in every element.
/// @throws std::filesystem::filesystem_error
upath canonicalForm(const upath &path);

/// The relative path from a folder to a path, both absolute and free of symbolic links: "." for the
/// folder itself.
ustring wayTo(const upath &path, const ustring &folder);

/// A path as a person in the current folder types it, see quoteName().
std::string showPath(const upath &path);

/// A file name that stays on its line and has no effect on the terminal: if it contains a control
/// character, a double quote, a backslash or a byte that is not UTF-8, it is put in double quotes
/// and these are escaped as in C, as git shows such names. One with a character that changes
/// the direction of writing is put in quotes too. Other names stay as they are.
std::string quoteName(const ustring &name);

/// A word as a person gives it to a shell, which reads the same bytes.
std::string quoteForShell(const std::string &word);

/// A text in which characters with an effect on the terminal are escaped as in quoteName(), except
/// line feeds and tabs.
std::string makePrintable(const ustring &text);

/// The name of a branch, remote or revision, for a message that has it in quotes.
std::string showName(const std::string &name);

/// As makePrintable(), with line feeds and tabs escaped too.
std::string makePrintableLine(const ustring &text);

/// What may be written to a terminal: the characters that change the direction of writing, and with
/// it the order in which a text is read, are escaped as in quoteName().
std::string escapeDirections(const std::string &text);

} // namespace vclink::shell
