// SPDX-License-Identifier: MIT
#pragma once

#include <memory>

#include "ShellInteractor.hpp"
#include "fl/filesystem/path.hpp"
#include "vclink/CMAdapter.hpp"
#include "vclink/git/GitAdapterFactory.hpp"

namespace vclink::shell
{

class Output;

/// What a command works with: the back end, the person at the terminal, and standard output.
class Session
{
  public:
    /// @param output must outlive the session
    explicit Session(Output &output);
    Session(const Session &) = delete;
    Session &operator=(const Session &) = delete;
    ~Session();

    Output &output() noexcept;
    const CMAdapterFactory &factory() const noexcept;
    const std::shared_ptr<ShellInteractor> &interactor() const noexcept;

    /// The adapter of the working copy that the current folder lies in; made at the first call.
    /// @throws ShellFailure when the current folder lies in none, and what the back end raises
    CMAdapter &adapter();

  private:
    Output &output_;
    git::GitAdapterFactory factory_;
    std::shared_ptr<ShellInteractor> interactor_;
    std::unique_ptr<CMAdapter> adapter_;
};

} // namespace vclink::shell
