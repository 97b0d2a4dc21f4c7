// SPDX-License-Identifier: MIT
#pragma once

#include "fl/ustring.hpp"
#include "vclink/ApplicationInteractor.hpp"
#include "vclink/ProgressReporter.hpp"
#include "vclink/Terminator.hpp"

namespace vclink::shell
{

/// Shows no progress.
class SilentProgressReporter : public ProgressReporter
{
  public:
    void setProgress(double fraction) override;
    void setProgressMessage(const ustring &message) override;
};

/// The person at the terminal, as the back end sees them.
class ShellInteractor : public ApplicationInteractor
{
  public:
    Terminator &getTerminator() override;
    ProgressReporter *getProgressReporter() override;

  private:
    Terminator terminator_;
    SilentProgressReporter progress_;
};

} // namespace vclink::shell
