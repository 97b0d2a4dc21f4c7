// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>

namespace vclink
{

/// The state of one file. A plain value, constructed from the number.
class FileState
{
  public:
    enum State : std::int32_t
    {
        Unversioned = 0, ///< in the working tree, not under version control
        Clean = 1,       ///< unchanged
        Unknown = 2,     ///< none of the others
        InConflict = 3,  ///< an unresolved conflict
        Modified = 4,    ///< changed
        Added = 5,       ///< new, to be in the next commit
        Deleted = 6,     ///< to be gone in the next commit
        Missing = 7      ///< gone from the working tree only
    };

    explicit FileState(std::int32_t state) noexcept : state_(static_cast<State>(state))
    {
    }

    State getState() const noexcept
    {
        return state_;
    }

    friend bool operator==(FileState left, FileState right) noexcept
    {
        return left.state_ == right.state_;
    }
    friend bool operator!=(FileState left, FileState right) noexcept
    {
        return !(left == right);
    }

  private:
    State state_;
};

} // namespace vclink
