// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <functional>
#include <memory>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "UserWork.hpp"
#include "fault/Operation.hpp"
#include "fault/Trial.hpp"
#include "support/GitFixture.hpp"
#include "support/LibGit2Session.hpp"

namespace vclink::test
{

/// The operations that write.
std::vector<Operation> operationsThatWrite();
/// Names the tests after their operations.
std::string nameOfOperation(const testing::TestParamInfo<Operation> &test);

/// Base of the fixtures whose tests take the disk away from an operation; each test has the
/// operation's name.
class DiskFixture : public GitFixture, public testing::WithParamInterface<Operation>
{
  protected:
    /// Prepares the operation, in a folder that is made.
    void prepare(const std::filesystem::path &folder);
    /// Tries the operation once.
    /// @param run has the action called, in want of what is taken away
    /// @param otherGists what it may leave, besides what it leaves otherwise, when it ends without
    ///        an exception
    /// @param losses what may be lost, by the names of the user's work
    void tryOnce(const std::function<std::string(const Action &)> &run,
                 const std::vector<std::string> &otherGists = {},
                 const std::vector<std::string> &losses = {});
    /// Runs an action in a child process without privileges, to which the files belong during that
    /// time.
    /// @return its outcome, or how else the child ended
    std::string runInChild(const Action &action) const;

    Trial &trial() const noexcept
    {
        return *trial_;
    }
    /// The state before the operation.
    const std::string &gistBefore() const noexcept
    {
        return gistBefore_;
    }
    /// How many of the trials failed; says so at the end.
    int failures() const noexcept
    {
        return failures_;
    }
    void TearDown() override;

  private:
    std::vector<std::string> lost() const;
    void expectNothingLeft() const;

    LibGit2Session session_{environment()};
    std::unique_ptr<Trial> trial_;
    std::string gistBefore_;
    std::vector<std::string> files_;
    UserWork before_;
    UserWork normal_;
    int trials_ = 0;
    int failures_ = 0;
};

} // namespace vclink::test
