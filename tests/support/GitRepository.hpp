// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <functional>
#include <string>
#include <vector>

#include "support/Command.hpp"

namespace vclink::test
{

/// A working copy, handled with the git command line. Names are bytes, relative to its root, with
/// slashes. Failures are exceptions, which fail the test: std::runtime_error of git,
/// std::filesystem::filesystem_error of files.
class GitRepository
{
  public:
    /// A new, empty repository with the branch "main"; makes the folder where it is missing.
    static GitRepository init(const std::filesystem::path &folder);
    /// A clone of `source`.
    static GitRepository clone(const std::filesystem::path &source,
                               const std::filesystem::path &folder);
    /// An existing working copy.
    explicit GitRepository(std::filesystem::path folder);

    const std::filesystem::path &path() const noexcept
    {
        return path_;
    }
    std::filesystem::path operator/(const std::string &name) const
    {
        return path_ / name;
    }
    /// The folder ".git", or the one that a file ".git" names: it has the index and HEAD. A bare
    /// repository is one itself.
    std::filesystem::path gitFolder() const;
    /// The folder with what all working trees of a repository share, e.g. its configuration.
    std::filesystem::path sharedGitFolder() const;

    /// Copies the working copy with all it holds, in place of what is there.
    GitRepository copyTo(const std::filesystem::path &folder) const;

    /// Writes a whole file, and makes the folders above it.
    void write(const std::string &name, const std::string &bytes) const;
    std::string read(const std::string &name) const;
    /// Makes a folder, and those above it.
    void makeFolder(const std::string &name) const;
    /// Removes a file, a link or a folder with all it holds.
    void remove(const std::string &name) const;
    /// Makes a symbolic link `name`, and the folders above it.
    void symlink(const std::string &target, const std::string &name) const;
    /// Sets the permissions, e.g. 0755.
    void setMode(const std::string &name, unsigned mode) const;

    /// Adds an identity to the repository's configuration, which has none.
    void identify(const std::string &name, const std::string &email) const;

    /// Stages these names exactly, as they stand; without names the whole tree.
    void add(const std::vector<std::string> &names = {}) const;
    /// Commits the index, also an unchanged one, under an identity that is not written to any
    /// configuration. The dates of one object's commits go up by a minute each.
    /// @return the id of the commit
    std::string commit(const std::string &message);
    /// add() of everything, and commit().
    std::string commitAll(const std::string &message);
    /// The same, after `change`.
    std::string commitAll(const std::function<void(const GitRepository &)> &change,
                          const std::string &message);
    /// Makes the branch at `start`, has `change` committed there and comes back to main.
    void makeBranch(const std::string &name,
                    const std::function<void(const GitRepository &)> &change,
                    const std::string &start = "main");

    /// Runs git in the working copy.
    /// @return what it wrote to standard output
    /// @throws std::runtime_error with its words when it fails
    std::string git(const std::vector<std::string> &arguments) const;
    /// As git(), without the line feed at the end.
    std::string line(const std::vector<std::string> &arguments) const;
    /// Runs git in the working copy; failure is in the result.
    CommandResult tryGit(const std::vector<std::string> &arguments) const;

    /// Has git check all objects, references and the index; what nothing refers to is in order.
    CommandResult check() const;

    /// The command that git() runs, to be changed before it is run.
    Command command(const std::vector<std::string> &arguments) const;

  private:
    std::filesystem::path path_;
    int commits_ = 0;
};

} // namespace vclink::test
