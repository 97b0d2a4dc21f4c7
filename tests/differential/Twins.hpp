// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <functional>
#include <map>
#include <memory>
#include <set>
#include <string>
#include <vector>

#include "ChangeModel.hpp"
#include "Snapshot.hpp"
#include "WorkingCopyMaker.hpp"
#include "vclink/CMAdapter.hpp"
#include "vclink/git/BranchManager.hpp"

namespace vclink::test
{

/// Two working copies that begin alike. What is done is done to both, to one by the library and to
/// the other by the model, and the running test fails where they are not alike afterwards.
class Twins
{
  public:
    /// @param folder to make the two in
    explicit Twins(const std::filesystem::path &folder);

    /// Commits these files and checks them out; without any the branch stays unborn.
    void begin(const std::vector<PlannedFile> &files);
    /// Changes the working trees.
    void edit(const std::function<void(WorkingCopyMaker &maker)> &change);

    /// Each gives the key of the refusal that it ended with; empty for a success.
    std::string add(const Names &names);
    std::string remove(const Names &names);
    std::string revert(const Names &names);
    std::string markResolved(const std::string &name);
    std::string commit(const std::string &message);

    /// Each lets the library do it, and fails the running test if anything is lost of what the user
    /// has in the working tree or the index, or if a refusal has changed anything. If git does
    /// something else, its working copy becomes like the library's.
    /// @return "refused", "as git", or "not as git"
    std::string switchTo(const std::string &branch);
    std::string mergeByLibrary(const std::string &branch);

    /// Makes a branch whose one commit follows HEAD, with these files; a file without a mode is
    /// deleted.
    void branch(const std::string &name, const std::vector<PlannedFile> &files);
    /// Lets git merge a branch, without a commit.
    /// @return whether there is no conflict
    bool merge(const std::string &branch);

    /// What is to be believed of both: git's report of the model's, of this moment.
    const GitReport &report();
    /// The working tree of both.
    const WorkingCopyMaker &workingTree() const noexcept
    {
        return library_.maker;
    }
    bool hasCommit() const;
    bool isMerging() const;
    /// Fails the running test if the library has left a broken repository.
    void checkIntegrity() const;
    /// What was done, a line a step.
    const std::string &script() const noexcept
    {
        return library_.maker.script();
    }

  private:
    struct Twin
    {
        explicit Twin(const std::filesystem::path &folder) : maker(folder)
        {
        }
        const GitRepository &repository() const noexcept
        {
            return maker.repository();
        }

        WorkingCopyMaker maker;
        /// The commits seen so far, numbered: their ids differ by the time of their making.
        std::map<std::string, std::string> commits;
    };

    /// Does the same with both, and compares the refusals and the working copies.
    std::string change(const std::function<void(CMAdapter &adapter)> &byLibrary,
                       const std::function<std::string(ChangeModel &model)> &byGit);
    /// The same of a change that may be refused.
    std::string tryChange(const std::function<void(git::BranchManager &branches)> &byLibrary,
                          const std::vector<std::string> &byGit);
    /// What the library must not lose, by id.
    std::set<std::string> worthKeeping(const Snapshot &before);
    bool areAlike();
    void adopt();
    void compare();
    /// The file of the branch that both are on.
    std::string headFile() const;
    static std::string describeHead(Twin &twin, const std::string &reference);
    std::string outcomeOf(const std::function<void()> &action) const;
    upath inRoot(const std::string &name) const;
    std::vector<upath> inRoot(const Names &names) const;
    void note(const std::string &verb, const Names &names);

    Twin library_;
    Twin git_;
    std::unique_ptr<CMAdapter> adapter_;
    ChangeModel model_;
    bool reportIsOld_ = true;
};

} // namespace vclink::test
