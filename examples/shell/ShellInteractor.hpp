// SPDX-License-Identifier: MIT
#pragma once

#include "Activity.hpp"
#include "TerminalProgressReporter.hpp"
#include "vclink/ApplicationInteractor.hpp"
#include "vclink/Terminator.hpp"

namespace vclink::shell
{

/// The person at the terminal, as the back end sees them.
class ShellInteractor : public ApplicationInteractor
{
  public:
    /// @param line where progress is shown; outlives the interactor
    explicit ShellInteractor(ProgressLine &line);

    Terminator &getTerminator() override;
    ProgressReporter *getProgressReporter() override;

    /// When the back end last reported anything.
    Activity &activity() noexcept;
    /// Whether files are being written, which can't be cancelled. Any thread.
    bool isWriting() const noexcept;

  private:
    Terminator terminator_;
    Activity activity_;
    TerminalProgressReporter progress_;
};

} // namespace vclink::shell
