// SPDX-License-Identifier: MIT
#pragma once

#include <memory>
#include <optional>
#include <string>

#include "support/libgit2/LibGit2Recorder.hpp"

namespace vclink::test::detail
{

/// Lets the calls of a test's own hooks go on unseen.
class Unseen
{
  public:
    Unseen() noexcept;
    Unseen(const Unseen &) = delete;
    Unseen &operator=(const Unseen &) = delete;
    ~Unseen();

  private:
    LibGit2Recorder *const recorder_;
};

/// A call on its way to libgit2, for the shims.
class Passing
{
  public:
    explicit Passing(const char *function) noexcept;
    Passing(const Passing &) = delete;
    Passing &operator=(const Passing &) = delete;
    ~Passing();

    /// Whether a recorder follows the call; where none does, nothing else here may be called.
    bool isFollowed() const noexcept
    {
        return recorder_ != nullptr;
    }
    /// @param taken what the call takes back
    void note(bool givesCode, bool releases, const void *taken) const;
    template <class Hook, class... Arguments> void tell(Arguments... arguments) const
    {
        const auto hook = find<Hook>(recorder_->hooks_);
        if (hook == nullptr)
            return;
        const Unseen unseen;
        (*hook)(arguments...);
    }
    /// What answers in libgit2's place, if anything does.
    template <class Answer> std::shared_ptr<Answer> answer() const
    {
        return find<Answer>(recorder_->answers_);
    }
    /// The fault of this call, if it has one.
    std::optional<LibGit2Fault> fault() const
    {
        return recorder_->findFault(function_);
    }
    void giveOut(const void *handle) const;
    /// Takes back what a callback of this call has made for libgit2: the repository of a clone.
    void takeBackFromCallbacks() const;
    /// Leaves the error record of a failing call.
    static void setError();
    /// Leaves earlierText after a call that has succeeded, unless libgit2 has left a text itself.
    void leaveText() const;

  private:
    template <class Function>
    std::shared_ptr<Function> find(const LibGit2Recorder::Placed &placed) const
    {
        const auto found = placed.find(function_);
        return found != placed.end() ? std::static_pointer_cast<Function>(found->second) : nullptr;
    }

    const char *const function_;
    LibGit2Recorder *recorder_;
};

} // namespace vclink::test::detail
