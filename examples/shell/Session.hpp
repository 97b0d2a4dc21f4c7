// SPDX-License-Identifier: MIT
#pragma once

#include <memory>
#include <optional>

#include "ShellInteractor.hpp"
#include "fl/filesystem/path.hpp"
#include "vclink/CMAdapter.hpp"
#include "vclink/git/GitAdapterFactory.hpp"
#include "vclink/git/LibGit2Guard.hpp"

namespace vclink::shell
{

class Output;
class ProgressLine;

/// What a command works with: the back end, the person at the terminal, standard output, and the
/// line for progress.
class Session
{
  public:
    /// @param output, progressLine must outlive the session
    Session(Output &output, ProgressLine &progressLine);
    Session(const Session &) = delete;
    Session &operator=(const Session &) = delete;
    ~Session();

    Output &output() noexcept;
    ProgressLine &progressLine() noexcept;
    const CMAdapterFactory &factory() const noexcept;
    const std::shared_ptr<ShellInteractor> &interactor() const noexcept;

    /// The adapter of the working copy that the current folder lies in; made at the first call.
    /// @throws ShellFailure when the current folder lies in none, and what the back end raises
    CMAdapter &adapter();

  private:
    Output &output_;
    ProgressLine &progressLine_;
    git::GitAdapterFactory factory_;
    std::shared_ptr<ShellInteractor> interactor_;
    std::unique_ptr<CMAdapter> adapter_;
    std::optional<git::LibGit2Guard> guard_;
};

} // namespace vclink::shell
