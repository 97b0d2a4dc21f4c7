// SPDX-License-Identifier: MIT
#pragma once

#include "vclink/git/GitError.hpp"
#include "vclink/git/GitException.hpp"
#include "vclink/git/export.hpp"

namespace vclink::git
{

/// Reports a failed call of libgit2. The message is "LibGit2Error", with libgit2's code, class and
/// text as arguments.
class VCLINK_GIT_EXPORT LibGit2Exception : public GitException
{
  public:
    /// Copies the failure.
    explicit LibGit2Exception(const GitError &error);
    /// Makes a deep copy, including the recorded stack.
    LibGit2Exception(const LibGit2Exception &other);
    ~LibGit2Exception() noexcept override;

    /// Returns a copy on the heap. The caller owns it.
    [[nodiscard]] const LibGit2Exception *clone() const override;
    /// Throws a copy whose type is LibGit2Exception.
    void rethrow() const override;

    /// Returns the failure, which lives as long as the exception.
    const GitError &getError() const noexcept;

  private:
    GitError error_;
};

} // namespace vclink::git
