// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
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
    /// @param takesAnyBare whether to work in a bare repository inside a working copy, too
    /// @param startFolder where the person is: absolute, free of symbolic links
    Session(Output &output, ProgressLine &progressLine, bool takesAnyBare = false,
            std::filesystem::path startFolder = {});
    Session(const Session &) = delete;
    Session &operator=(const Session &) = delete;
    ~Session();

    Output &output() noexcept;
    ProgressLine &progressLine() noexcept;
    const CMAdapterFactory &factory() const noexcept;
    const std::shared_ptr<ShellInteractor> &interactor() const noexcept;

    /// The adapter of the working copy that contains the current folder; made at the first call.
    /// @throws ShellFailure if there is none, or if it is a bare repository inside a working copy;
    ///         and what the back end throws
    CMAdapter &adapter();

    /// Whether adapter() has returned one. A clone needs none.
    bool hasAdapter() const noexcept;

    /// As adapter().
    /// @throws ShellFailure also in a bare repository, which has no files
    CMAdapter &workingCopy();

    /// The folder in which the program was started, before -C.
    const std::filesystem::path &startFolder() const noexcept;

    /// Notes that the program is to end as by this signal, whatever the command's own status is.
    void endBySignal(int signal) noexcept;
    /// The signal that the program is to end as by.
    std::optional<int> endingSignal() const noexcept;

  private:
    Output &output_;
    ProgressLine &progressLine_;
    bool takesAnyBare_;
    std::filesystem::path startFolder_;
    std::optional<int> endingSignal_;
    git::GitAdapterFactory factory_;
    std::shared_ptr<ShellInteractor> interactor_;
    std::unique_ptr<CMAdapter> adapter_;
    std::optional<git::LibGit2Guard> guard_;
};

} // namespace vclink::shell
