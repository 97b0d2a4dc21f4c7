// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <filesystem>
#include <iosfwd>
#include <map>
#include <string>

#include "support/GitRepository.hpp"

namespace vclink::test
{

/// The content of a repository, as git's own commands and the file system report it. Two of them,
/// before and after an operation, show what the operation changed. Writes nothing. Does not contain
/// objects without a reference.
struct RepositoryState
{
    /// Names relative to the root as bytes, with the content.
    using Entries = std::map<std::string, std::string>;

    /// The branch that HEAD names, if any, and the commit's id, if there is one.
    std::string head;
    /// Every reference with what it names.
    std::string references;
    /// HEAD's own reflog.
    std::string reflog;
    /// The files of a merge, cherry-pick, revert or bisection that is under way, and a lock.
    Entries underWay;
    /// `git ls-files -v --stage`: tag, mode, id and stage of each name, a line a stage.
    Entries index;
    /// Mode and content of each file below the root, the repository's own folder left out. Long
    /// contents are replaced by length and hash.
    Entries workingTree;
};

/// @throws std::runtime_error when git can't tell
RepositoryState stateOf(const GitRepository &repository);
/// The index alone.
RepositoryState::Entries indexOf(const GitRepository &repository);
/// The working tree alone.
RepositoryState::Entries workingTreeOf(const GitRepository &repository);

bool operator==(const RepositoryState &left, const RepositoryState &right);
bool operator!=(const RepositoryState &left, const RepositoryState &right);
std::ostream &operator<<(std::ostream &stream, const RepositoryState &state);

/// A file's identity, times and bytes. If two are equal, nobody wrote the file in between, not even
/// with the same bytes. A missing file has one, too.
struct FileStamp
{
    std::uintmax_t inode = 0;
    std::int64_t modified = 0;
    std::int64_t changed = 0;
    std::string bytes;
};

/// @throws std::system_error when the file can't be examined
FileStamp stampOf(const std::filesystem::path &file);
/// The state of the repository's index file.
FileStamp indexStampOf(const GitRepository &repository);

bool operator==(const FileStamp &left, const FileStamp &right);
bool operator!=(const FileStamp &left, const FileStamp &right);
std::ostream &operator<<(std::ostream &stream, const FileStamp &stamp);

/// Fails the running test at its end when the repository's state is another than at its start, or
/// when anybody wrote the index file.
class NothingChanges
{
  public:
    explicit NothingChanges(const GitRepository &repository);
    NothingChanges(const NothingChanges &) = delete;
    NothingChanges &operator=(const NothingChanges &) = delete;
    ~NothingChanges();

  private:
    GitRepository repository_;
    RepositoryState state_;
    FileStamp index_;
};

} // namespace vclink::test
