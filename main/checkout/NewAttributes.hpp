// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <string_view>
#include <vector>

#include <git2/diff.h>
#include <git2/types.h>

namespace vclink::git
{

/// Returns true for the path of a `.gitattributes`.
inline bool isAttributesFile(std::string_view path)
{
    constexpr std::string_view name = ".gitattributes";
    return path.size() >= name.size() && path.substr(path.size() - name.size()) == name &&
           (path.size() == name.size() || path[path.size() - name.size() - 1] == '/');
}

/// Returns true if this is written as a file: git reads no attributes from links.
inline bool isWritten(const git_diff_file &file)
{
    return file.mode == GIT_FILEMODE_BLOB || file.mode == GIT_FILEMODE_BLOB_EXECUTABLE;
}

/// The `.gitattributes` that a checkout writes. git writes every file as the new attributes say.
/// libgit2 looks for attributes in the working tree and in the index while it writes, and reads
/// each place only once. Therefore it would write most files as the old attributes say, and the
/// next commit could store them damaged.
class NewAttributes
{
  public:
    /// Notes a file if it contains attributes. Call it for each file before the checkout writes the
    /// first one.
    /// @param path absolute
    /// @param file what the checkout makes of it
    void note(std::string_view path, const git_diff_file &file)
    {
        if (isAttributesFile(path) && isWritten(file))
        {
            noted_.push_back({file.path, file});
            isPending_ = true;
        }
    }

    /// Notes a change of the other side of a merge, which can end in a conflict: libgit2 does not
    /// report that file.
    void noteChange(std::string_view path)
    {
        if (isAttributesFile(path))
        {
            isPending_ = true;
            canConflict_ = true;
        }
    }

    /// Returns true if apply() has something to do.
    bool isPending() const noexcept
    {
        return isPending_;
    }

    /// Makes libgit2 read the noted attributes: removes the old files, and sets the entries in the
    /// index, in memory. Makes it forget what it has read:
    /// it would keep the old meaning of macros, and look for them in memory that it has released.
    /// Call it right before the checkout writes.
    /// @throws LibGit2Exception
    void apply(git_repository *repository);

    /// Makes libgit2 forget attributes that are in conflict now. Call it after the checkout.
    void settle(git_repository *repository) const;

  private:
    struct Noted
    {
        std::string name;
        /// Its path is not valid any more.
        git_diff_file file;
    };

    std::vector<Noted> noted_;
    bool isPending_ = false;
    bool canConflict_ = false;
};

/// Sets the entry of a file that is to be written in the index, in memory. git_index_add, unless
/// the entry is the same already.
/// @param name relative to the root
/// @throws LibGit2Exception
void setAttributes(git_index *index, const char *name, const git_diff_file &file);

} // namespace vclink::git
