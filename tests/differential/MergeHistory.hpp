// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

#include "MergeEdits.hpp"
#include "Random.hpp"
#include "support/GitRepository.hpp"

namespace vclink::test
{

/// A merge commit.
struct MergeCommit
{
    std::string firstParent;
    std::string secondParent;
    std::string subject;
};

/// The history of three branches, "tip0" to "tip2", over a few dozen files, with topic branches
/// between them. It depends on the seed alone. The subject of a merge commit describes the last
/// change of both sides.
class MergeHistory
{
  public:
    /// @param merges how many merge commits to make at least
    MergeHistory(std::uint64_t seed, std::size_t merges);

    /// Brings the history into a repository.
    void importInto(const GitRepository &repository) const;

  private:
    struct Commit
    {
        Tree tree;
        /// of each earlier commit, whether it is an ancestor
        std::vector<bool> ancestors;
    };
    using Number = std::size_t;

    Number commit(const std::string &subject, const std::vector<Number> &parents, Tree tree);
    void writeTree(const Tree &before, const Tree &after);
    void addMerges(const MergeEdits::Kind &kind);
    /// As a person would resolve it; not what any merge would give.
    Number merge(const std::string &subject, Number ours, Number theirs);
    Number findMergeBase(Number left, Number right) const;
    Number editSomewhere(Number parent);

    Random random_;
    MergeEdits edits_{random_};
    std::vector<Commit> commits_;
    std::vector<Number> tips_;
    std::size_t merges_ = 0;
    std::string stream_;
};

/// All merge commits of two parents that a repository's branches lead to, oldest first.
std::vector<MergeCommit> listMerges(const GitRepository &repository);

} // namespace vclink::test
