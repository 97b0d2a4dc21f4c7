// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>
#include <cstdint>
#include <filesystem>
#include <functional>
#include <map>
#include <string>
#include <vector>

#include "Random.hpp"
#include "RandomNames.hpp"
#include "Twins.hpp"

namespace vclink::test
{

/// Random changes of two working copies, which depend on the seed alone.
class ChangeSequence
{
  public:
    ChangeSequence(std::uint64_t seed, const std::filesystem::path &folder);

    void run();
    /// What was done, a line a step.
    const std::string &script() const noexcept
    {
        return twins_.script();
    }
    /// How often each change was made, refusals apart.
    const std::map<std::string, int> &counts() const noexcept
    {
        return counts_;
    }

  private:
    void begin();
    void change();
    void add();
    void remove();
    void revert();
    void markResolved();
    void commit();
    void merge();
    /// Goes to another branch, or takes one in, by the library.
    void goOn();
    /// Makes a branch, here and there of what is in the way of it in the working tree.
    /// @return its name
    std::string makeBranch();
    PlannedFile planInTheWay();

    void count(const std::string &change, const std::string &refusal);

    // ChangeEdits.cpp: changes of the working trees alone
    void edit();
    void editFile(const std::string &path);
    void changeType(const std::string &path);
    void link(const std::string &path);
    void replaceByFolder(const std::string &path);
    void replaceByFile(const std::string &folder);
    void addUntracked();
    void write(const std::string &path, const std::string &content);

    /// A new path that a list may name and that a file may be written to; empty where there is
    /// none.
    std::string freshPath();
    std::string makeLinkTarget();
    PlannedFile planFile(const std::string &path);

    /// The paths of git's report that a list may name and that `isWanted` takes.
    Names listable(const std::function<bool(const GitFile &file)> &isWanted);
    /// A name of an untracked file made before, which may be ignored, tracked or gone by now, or of
    /// nothing.
    std::string somethingMade();
    /// Some of `names`, and now and then a name of something else.
    Names pickSome(const Names &names, std::size_t most);
    /// Whether the index has something below a path.
    bool hasIndexedBelow(const std::string &path);
    bool canBeReverted(const Names &names);
    bool canBeStaged(const Names &names);
    /// The files of HEAD that are files in the working tree too.
    Names committedFiles();

    Random random_;
    RandomNames names_{random_};
    Twins twins_;
    std::map<std::string, int> counts_;
    Names made_;
    Names branchNames_{"main"};
    int branches_ = 0;
    /// how far back the last file was dated that had to be
    std::chrono::hours hours_{0};
};

} // namespace vclink::test
