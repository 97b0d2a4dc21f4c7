// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <functional>
#include <string>
#include <vector>

#include "support/GitRepository.hpp"

namespace vclink::test
{

/// What is done in a working copy, for the rows of a table.
using Change = std::function<void(const GitRepository &)>;

inline const Change changesNothing = [](const GitRepository &) {};

inline Change operator+(const Change &first, const Change &second)
{
    return [=](const GitRepository &copy)
    {
        first(copy);
        second(copy);
    };
}

inline Change writes(const std::string &name, const std::string &bytes)
{
    return [=](const GitRepository &copy) { copy.write(name, bytes); };
}

/// The same in each of these files.
inline Change writesEach(const std::vector<std::string> &names, const std::string &bytes)
{
    return [=](const GitRepository &copy)
    {
        for (const auto &name : names)
            copy.write(name, bytes);
    };
}

inline Change makesFolder(const std::string &name)
{
    return [=](const GitRepository &copy) { copy.makeFolder(name); };
}

inline Change removes(const std::string &name)
{
    return [=](const GitRepository &copy) { copy.remove(name); };
}

inline Change makesExecutable(const std::string &name)
{
    return [=](const GitRepository &copy) { copy.setMode(name, 0755); };
}

/// A symbolic link, which replaces what is there.
inline Change links(const std::string &target, const std::string &name)
{
    return [=](const GitRepository &copy)
    {
        std::filesystem::remove(copy / name);
        copy.symlink(target, name);
    };
}

inline Change runsGit(const std::vector<std::string> &arguments)
{
    return [=](const GitRepository &copy) { copy.git(arguments); };
}

inline Change moves(const std::string &from, const std::string &to)
{
    return runsGit({"mv", from, to});
}

} // namespace vclink::test
