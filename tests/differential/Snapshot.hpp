// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <map>
#include <set>
#include <string>

namespace vclink::test
{

/// What a working copy holds, read without git and without opening a pipe.
struct Snapshot
{
    using Entries = std::map<std::string, std::string>;

    /// Kind, mode and content of each file, folder, link, pipe and socket.
    Entries files;
    /// Mode, id, stage and flags of each entry of the index.
    Entries index;
    /// HEAD, every reference, the tree and the parents of HEAD's commit. In a linked working tree,
    /// also HEAD of the main one.
    Entries history;
    /// The files of an operation that is under way, and locks.
    Entries underWay;
    /// Inode and time of change of each file and link, and of the main working tree's index beside
    /// a linked one: if both are equal, nobody wrote it in between.
    Entries stamps;
    /// The ids of what the files and links hold, and of the index's entries.
    Entries fileIds;
    std::set<std::string> indexIds;
};

/// The id of a file with these bytes.
std::string blobIdOf(const std::string &bytes);

/// @param folder holds the working copy and what is beside it, or is the working copy itself
Snapshot takeSnapshot(const std::filesystem::path &copy, const std::filesystem::path &folder);

/// The ids of everything that the references of a working copy reach.
std::set<std::string> committedContents(const std::filesystem::path &copy);

/// The ids of everything in the commits that the references of a working copy name themselves.
std::set<std::string> tipContents(const std::filesystem::path &copy);

/// Which of these contents a working copy holds neither in its files nor in its index nor in a
/// commit.
/// @param after of the working copy
std::set<std::string> lostOf(std::set<std::string> contents, const Snapshot &after,
                             const std::filesystem::path &copy);

/// What differs, a line each; empty where both hold the same. Commits count by tree and parents,
/// since their ids differ by the time of their making.
std::string differenceOf(const Snapshot &left, const Snapshot &right);

/// As differenceOf(), and nobody has written a file, moved a reference or touched the index.
std::string changeOf(const Snapshot &before, const Snapshot &after);

} // namespace vclink::test
