// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <filesystem>
#include <memory>
#include <string>

#include "differential/Random.hpp"
#include "support/TestInteractor.hpp"
#include "vclink/CMAdapter.hpp"
#include "vclink/git/BranchManager.hpp"

namespace vclink::test
{

/// A host at work in a Workplace, until it is killed. Every operation of the library is made
/// through the exported classes. Before and after the operation that it is asked for it writes a
/// line to standard output: "begin NAME", "end NAME ID", ID being the id of HEAD.
class Worker
{
  public:
    Worker(std::filesystem::path workplace, std::uint64_t seed);

    /// Throws away what an earlier worker left uncommitted, and goes to main.
    void tidy();
    /// Gives the operation something to do, and does it.
    /// @throws std::out_of_range for an unknown name, and what the operation throws
    void perform(const std::string &operation);

  private:
    void prepare(const std::string &operation);
    void call(const std::string &operation);

    /// Changes these many files of a folder of the working copy.
    void change(const std::string &folder, int files = 25);
    void commit();
    /// Leaves on "topic" what main lacks, and HEAD on main.
    /// If it is driven, with files that main will change too, and that a command merges.
    void advanceTopic(bool isDriven);
    void revertAll();
    void removeUnversioned();
    std::string head() const;

    std::filesystem::path workplace_;
    std::filesystem::path root_;
    Random random_;
    std::shared_ptr<TestInteractor> interactor_ = std::make_shared<TestInteractor>();
    std::shared_ptr<CMAdapter> adapter_;
    std::shared_ptr<git::BranchManager> branches_;
};

} // namespace vclink::test
