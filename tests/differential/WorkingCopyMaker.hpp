// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <string>
#include <vector>

#include "support/GitRepository.hpp"

namespace vclink::test
{

/// A file as a tree or the working tree holds it.
struct PlannedFile
{
    std::string path;
    /// Git's: "100644", "100755", "120000", "160000"
    std::string mode;
    /// its bytes, a link's target, or the id of a submodule's commit
    std::string content;
};

/// One side of a path in the index.
struct IndexSide
{
    std::string path;
    std::string mode;
    std::string id;
    /// 0, or 1 to 3 for the sides of a conflict
    int stage = 0;
};

/// Changes a working copy step by step, with few runs of git, and writes down each step.
class WorkingCopyMaker
{
  public:
    /// A new, empty repository.
    explicit WorkingCopyMaker(const std::filesystem::path &folder);

    const GitRepository &repository() const noexcept
    {
        return repository_;
    }
    /// What was done, a line a step.
    const std::string &script() const noexcept
    {
        return script_;
    }
    void note(const std::string &line);

    /// Commits these files to the branch "main", if there are any, and stores blobs of the given
    /// contents.
    /// @return the blobs' ids
    std::vector<std::string> import(const std::vector<PlannedFile> &files,
                                    const std::vector<std::string> &blobs);
    /// Fills the index and the working tree from HEAD.
    void checkOut();

    /// Each makes the folders above `path`, and replaces an existing file or link.
    void write(const std::string &path, const std::string &bytes);
    void link(const std::string &target, const std::string &path);
    /// Removes a file, a link or a folder with all it holds.
    void remove(const std::string &path);
    void setExecutable(const std::string &path, bool executable);
    void makeFolder(const std::string &path);
    /// Copies a repository; with `gitFile`, its ".git" goes below the one of this repository.
    void copyRepository(const std::filesystem::path &source, const std::string &path, bool gitFile);

    /// Makes the index of these paths what the working tree is; paths that are gone leave it.
    void stage(const std::vector<std::string> &paths);
    void unstage(const std::vector<std::string> &paths);
    void setIndex(const std::vector<IndexSide> &sides);
    void intendToAdd(const std::vector<std::string> &paths);
    /// Dates all files back by an hour, and has the index know it: its entries are not racy then.
    void settle();

    std::string read(const std::string &path) const;
    std::string readLink(const std::string &path) const;
    /// None of these looks through a link on the way.
    bool isFile(const std::string &path) const;
    bool isLink(const std::string &path) const;
    bool isFolder(const std::string &path) const;
    bool exists(const std::string &path) const;
    /// Whether only folders are above `path`.
    bool canHold(const std::string &path) const;

  private:
    std::filesystem::file_type typeOf(const std::string &path) const;
    void noteAll(const std::string &verb, const std::vector<std::string> &paths);

    std::string script_;
    GitRepository repository_;
};

} // namespace vclink::test
