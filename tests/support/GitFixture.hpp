// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include <gtest/gtest.h>

#include "GitRepository.hpp"
#include "HermeticEnvironment.hpp"
#include "TemporaryFolder.hpp"

namespace vclink::test
{

/// Base of the fixtures whose tests touch files: each test has a folder, a home and an environment
/// of its own. libgit2 is not started; see LibGit2Session.
class GitFixture : public testing::Test
{
  protected:
    GitFixture() = default;
    ~GitFixture() override;

    /// The test's folder. "home", "tmp" and "etc" in it are taken.
    const TemporaryFolder &folder() const noexcept
    {
        return folder_;
    }
    const HermeticEnvironment &environment() const noexcept
    {
        return environment_;
    }
    /// A new repository in the test's folder.
    GitRepository makeRepository(const std::string &name = "repository") const;

  private:
    TemporaryFolder folder_;
    HermeticEnvironment environment_{folder_.path()};
};

} // namespace vclink::test
