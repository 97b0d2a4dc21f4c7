// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

#include <git2/diff.h>
#include <git2/index.h>
#include <git2/tree.h>

#include "error/errorUtil/GitResult.hpp"

/// Index entries of submodules, which git calls gitlinks.
namespace vclink::git
{

/// Returns false for null.
inline bool isGitlink(const git_tree_entry *entry)
{
    return entry != nullptr && git_tree_entry_filemode(entry) == GIT_FILEMODE_COMMIT;
}

inline bool isGitlink(const git_index_entry *entry)
{
    return entry != nullptr && entry->mode == GIT_FILEMODE_COMMIT;
}

inline bool isGitlink(const git_diff_file *file)
{
    return file != nullptr && file->mode == GIT_FILEMODE_COMMIT;
}

struct Gitlink
{
    std::string path;
    git_oid id;
};

/// Adds an entry to an index, in memory, or replaces it. git_index_add.
/// @throws LibGit2Exception
inline void addGitlink(git_index *index, const Gitlink &gitlink)
{
    git_index_entry entry{};
    entry.path = gitlink.path.c_str();
    entry.mode = GIT_FILEMODE_COMMIT;
    entry.id = gitlink.id;
    check(git_index_add, index, &entry);
}

inline void addGitlinks(git_index *index, const std::vector<Gitlink> &gitlinks)
{
    for (const Gitlink &gitlink : gitlinks)
    {
        addGitlink(index, gitlink);
    }
}

} // namespace vclink::git
