// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "support/GitRepository.hpp"

namespace vclink::test
{

/// What a person does who finds a merge of "topic" that was killed, its locks removed: notes
/// something in a new file, edits one that the merge does not touch, and goes on by one road or the
/// other. The running test fails if the history says "merged" without the work of both sides, or if
/// what the person wrote is lost.
class InterruptedMerge
{
  public:
    explicit InterruptedMerge(GitRepository repository);

    /// Commits by the library, as if nothing had happened.
    /// @return false when it refuses
    bool commit();
    /// Follows the words of that refusal, and merges again by the library.
    void beginAgain();

  private:
    void writeOwnWork();
    void expectOwnWork() const;
    void followWayOut();
    void expectBothSides() const;

    GitRepository repository_;
    /// what the person writes begins so, another time after each crash
    std::string own_;
    /// that the commit was refused with
    std::string refusal_;
};

} // namespace vclink::test
