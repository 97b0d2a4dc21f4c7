// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>

#include "fl/ustring.hpp"
#include "vclink/git/export.hpp"

namespace vclink::git
{

/// A failure of libgit2 as a value: its return code, and what git_error_last() told of it. A plain
/// value; copies are independent.
class VCLINK_GIT_EXPORT GitError
{
  public:
    /// No failure: code 0, class 0, empty message.
    GitError() = default;

    /// The failure of a libgit2 call that has just returned `code` on this thread. Class and
    /// message come from git_error_last(), which is not read for code 0, so that a success never
    /// picks up an earlier failure's record. To be made before any other libgit2 call on the
    /// thread.
    /// @throws std::bad_alloc
    explicit GitError(int code);

    /// libgit2's return code, git_error_code; 0 is success.
    std::int32_t getCode() const noexcept;
    /// The `klass` of libgit2's error record, git_error_t; 0 when there was none.
    std::int32_t getErrorClass() const noexcept;
    /// The text of libgit2's error record; empty when there was none.
    ustring getMessage() const;

  private:
    std::int32_t code_ = 0;
    std::int32_t errorClass_ = 0;
    ustring message_;
};

} // namespace vclink::git
