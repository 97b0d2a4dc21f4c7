// SPDX-License-Identifier: MIT
#include "main/mergeState/MergeBases.hpp"

#include <git2/commit.h>

namespace vclink::git
{

std::vector<OwnedHandle<git_tree>> readTrees(git_repository *repository, const MergeBases &bases)
{
    std::vector<OwnedHandle<git_tree>> trees;
    trees.reserve(bases.size() + 1);
    for (std::size_t i = 0; i < bases.size(); ++i)
    {
        const OwnedHandle<git_commit> commit =
            acquire<git_commit>(git_commit_lookup, repository, bases.at(i)).value();
        trees.push_back(acquire<git_tree>(git_commit_tree, commit.get()).value());
    }
    if (trees.empty())
    {
        trees.push_back(nullptr);
    }
    return trees;
}

} // namespace vclink::git
