// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <filesystem>
#include <string>
#include <vector>

#include "Random.hpp"
#include "RandomNames.hpp"
#include "WorkingCopyMaker.hpp"

namespace vclink::test
{

/// A repository of two commits, from which submodules and nested repositories are copied. It is
/// checked out at the second.
struct OtherRepository
{
    explicit OtherRepository(const std::filesystem::path &folder);

    std::filesystem::path folder;
    std::string firstCommit;
    std::string secondCommit;
};

/// A repository that is empty at first, and then in a state that depends on the seed alone, the
/// times of its files apart: a commit, changes of the index, changes of the working tree.
class RandomWorkingCopy
{
  public:
    RandomWorkingCopy(std::uint64_t seed, const std::filesystem::path &folder,
                      const OtherRepository &other);

    void make();

    const GitRepository &repository() const noexcept
    {
        return maker_.repository();
    }
    /// What was done, a line a step.
    const std::string &script() const noexcept
    {
        return maker_.script();
    }

  private:
    // RandomTree.cpp: what HEAD holds
    void commitTree(std::size_t files);
    PlannedFile planFile(const std::vector<PlannedFile> &before);
    std::string makeLinkTarget(const std::string &link);
    void fillUnbornBranch(std::size_t files);

    // RandomIndexChanges.cpp: staged changes, one a path at most
    void changeIndex();
    void stageChange(const std::string &path);
    void stageEdit(const std::string &path);
    void stageRemoval(const std::string &path);
    void stageMove(const std::string &path);
    void stageOtherType(const std::string &path);
    void stageFolderInstead(const std::string &path);
    void stageFileInsteadOfFolder();
    void stageConflict(const std::string &path);
    void addFiles();
    void applyIndexChanges();

    // RandomEdits.cpp: changes of the working tree alone
    void changeWorkingTree();
    void edit(const std::string &path);
    void changeType(const std::string &path);
    void replaceByFolder(const std::string &path);
    void changeFolder();
    void addUntracked();
    void writeIgnoreFile();

    // RandomSubmodules.cpp
    std::string someCommit();
    void planSubmodules(std::vector<PlannedFile> &files);
    void populateSubmodules();
    void changeSubmodule(const std::string &path);
    void addNestedRepository();

    /// A new path that a file may be written to, which the working tree may forbid: then empty.
    std::string freshPath();
    /// A path of `tracked_` below which there are others; empty if there is none.
    std::string someTrackedFolder();

    Random random_;
    RandomNames names_{random_};
    WorkingCopyMaker maker_;
    const OtherRepository &other_;
    /// how many of 100 paths are changed, in the index and again in the working tree
    unsigned rate_;
    /// whether files may be alike byte by byte
    bool duplicates_;
    std::vector<std::string> tracked_;
    std::vector<std::string> submodules_;
    /// ids of blobs for sides that are in the index only
    std::vector<std::string> blobs_;

    std::vector<std::string> toStage_;
    std::vector<std::string> toUnstage_;
    std::vector<std::string> toIntend_;
    std::vector<IndexSide> sides_;
};

} // namespace vclink::test
