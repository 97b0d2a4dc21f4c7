// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>

#include "fl/ustring.hpp"
#include "vclink/git/export.hpp"

namespace vclink::git
{

/// A failure of libgit2 as a value: its return code, and the error record of git_error_last(). A
/// plain value; copies are independent.
class VCLINK_GIT_EXPORT GitError
{
  public:
    /// Creates the value of no failure: code 0, class 0, empty message.
    GitError() = default;

    /// Records the failure of a libgit2 call that has just returned `code` on this thread. Call it
    /// before any other libgit2 call on the thread. Class and message are those of
    /// git_error_last(), which is not read for code 0, so that a success never has the record of an
    /// earlier failure.
    /// @throws std::bad_alloc
    explicit GitError(int code);

    /// Returns libgit2's return code, a git_error_code. 0 is success.
    std::int32_t getCode() const noexcept;
    /// Returns the `klass` of libgit2's error record, a git_error_t, or 0 if there was no record.
    std::int32_t getErrorClass() const noexcept;
    /// Returns the text of libgit2's error record, empty if there was no record.
    ustring getMessage() const;

  private:
    std::int32_t code_ = 0;
    std::int32_t errorClass_ = 0;
    ustring message_;
};

} // namespace vclink::git
