// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <functional>
#include <string>
#include <vector>

#include "support/Change.hpp"

namespace vclink::test
{

/// What a place holds in the commit that a situation begins with.
enum class Holds
{
    Nothing,
    File,
    Folder,
    Submodule
};

/// The place of an obstacle, and what the other branch does there.
struct Place
{
    std::string name;
    Holds holds;
    bool isCommon;
    std::string path;
    /// a branch of the working copy that makeSurroundings() makes
    std::string branch;
    /// Clears the place, where even what it holds is in the way.
    Change giveWay = changesNothing;
};

/// Something in a working copy that is not as it was committed.
struct Obstacle
{
    std::string name;
    /// the places where it can be put
    Holds place;
    bool isCommon;
    std::function<void(const GitRepository &copy, const std::string &path)> put;
    /// an operation might wait for it for ever
    bool mayBlock = false;
};

const std::vector<Place> &allPlaces();
const std::vector<Obstacle> &allObstacles();

/// Makes "copy", a working copy on "main", and "outside" in a folder. Each place's branch follows
/// the one commit of main and also changes the first and the last file; "ours" follows it with a
/// change of a file that no other branch touches.
void makeSurroundings(const std::filesystem::path &folder);

/// The same, with a sibling beside most places' path, which each branch but "ours" changes.
void makeSurroundingsWithSiblings(const std::filesystem::path &folder);

/// The name beside a path that libgit2 sorts between a file of that path and a folder of it.
std::string siblingOf(const std::string &path);

/// The same of submodules, and two more.
const std::vector<Place> &submodulePlaces();
const std::vector<Obstacle> &submoduleObstacles();

/// Places of submodules that ours has changed, too: on "ours-adds", "ours-moves",
/// "ours-removes", "ours-files" and "ours-folders".
const std::vector<Place> &addedSubmodulePlaces();
const std::vector<Place> &movedSubmodulePlaces();
const std::vector<Place> &removedSubmodulePlaces();
const std::vector<Place> &replacedSubmodulePlaces();
const std::vector<Place> &unfoldedSubmodulePlaces();

/// Makes "copy", a working copy on "main" with submodules, and "source", where these come from.
/// Each of its branches changes the first and the last file as well, but those that begin with
/// "ours".
void makeSubmoduleSurroundings(const std::filesystem::path &folder);
void makeSubmoduleSurroundingsWithSiblings(const std::filesystem::path &folder);

/// Turns what makeSurroundings() has made into a repository "main", whose HEAD is detached, and
/// "copy", a linked working tree of it.
void linkSurroundings(const std::filesystem::path &folder);

/// Copies what makeSurroundings() and linkSurroundings() have made.
void copySurroundings(const std::filesystem::path &from, const std::filesystem::path &to);

/// Puts the files and the index back to what makeSurroundings() has made, and nothing else.
void clearSurroundings(const std::filesystem::path &original, const std::filesystem::path &folder);

} // namespace vclink::test
