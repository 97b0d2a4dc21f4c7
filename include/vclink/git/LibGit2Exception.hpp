// SPDX-License-Identifier: MIT
#pragma once

#include "vclink/git/GitError.hpp"
#include "vclink/git/GitException.hpp"
#include "vclink/git/export.hpp"

namespace vclink::git
{

/// A call of libgit2 failed. The message is "LibGit2Error", with libgit2's code, class and text as
/// arguments.
class VCLINK_GIT_EXPORT LibGit2Exception : public GitException
{
  public:
    /// Copies the failure.
    explicit LibGit2Exception(const GitError &error);
    /// A deep copy, the recorded stack included.
    LibGit2Exception(const LibGit2Exception &other);
    ~LibGit2Exception() noexcept override;

    /// A copy on the heap, which the caller owns.
    [[nodiscard]] const LibGit2Exception *clone() const override;
    /// Throws a copy of this class.
    void rethrow() const override;

    /// The failure that the exception was made from, which lives as long as the exception.
    const GitError &getError() const noexcept;

  private:
    GitError error_;
};

} // namespace vclink::git
