// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "support/GitRepository.hpp"

namespace vclink::test
{

/// What a person does after a merge of "topic" was killed and its locks are removed: writes a new
/// file, edits one that the merge does not touch, and either commits or begins again. The running
/// test fails if the history says "merged" without the work of both sides, or if anything that the
/// person wrote is lost.
class InterruptedMerge
{
  public:
    explicit InterruptedMerge(GitRepository repository);

    /// Commits by the library, as if nothing had happened.
    /// @return false when it refuses
    bool commit();
    /// Runs the commands in the text of the refusal, and merges again with the library.
    void beginAgain();

  private:
    void writeOwnWork();
    void expectOwnWork() const;
    void followWayOut();
    void expectBothSides() const;

    GitRepository repository_;
    /// the beginning of what the person writes, different after each crash
    std::string own_;
    /// that the commit was refused with
    std::string refusal_;
};

} // namespace vclink::test
