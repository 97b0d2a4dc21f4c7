// SPDX-License-Identifier: MIT
#pragma once

#include "error/logging/logger.hpp"

namespace vclink::git
{

/// Traces one function: writes a record at its entry and one at its exit, and between them adds one
/// to the logger's count of open scopes of the thread. Decides at the entry whether to trace. Lives
/// on the stack.
class ScopeTrace
{
  public:
    /// @param target the logger, which outlives the trace
    /// @param signature the function's full signature; kept as a pointer
    /// @param path the function's source; kept as a pointer
    /// @param line the function's line in it
    /// @throws what the sinks throw; then the scope is not counted
    [[nodiscard]] ScopeTrace(Logger &target, const char *signature, const char *path, unsigned line)
        : logger_(target), signature_(signature), path_(path), line_(line)
    {
        if (logger_.is_enabled(SeverityScopeEntry))
        {
            enter();
        }
    }
    ScopeTrace(const ScopeTrace &) = delete;
    ScopeTrace &operator=(const ScopeTrace &) = delete;
    /// A sink that throws here ends the process, as in any destructor.
    ~ScopeTrace()
    {
        if (entered_)
        {
            leave();
        }
    }

    const char *getPath() const noexcept
    {
        return path_;
    }
    unsigned getLine() const noexcept
    {
        return line_;
    }

  private:
    void enter();
    void leave();

    Logger &logger_;
    bool entered_ = false;
    const char *signature_;
    const char *path_;
    unsigned line_;
};

} // namespace vclink::git
