// SPDX-License-Identifier: MIT
#include "discardedContents.hpp"

#include <cstddef>
#include <cstdlib>
#include <filesystem>
#include <set>
#include <string_view>
#include <system_error>

#include <unistd.h>

#include "failures.hpp"
#include "fl/i18n/convert.hpp"
#include "gitProgram.hpp"
#include "names.hpp"
#include "texts.hpp"
#include "workingCopy.hpp"

namespace vclink::shell
{
namespace
{

namespace fs = std::filesystem;

/// An index of its own, in a folder that goes away with it.
class ScratchIndex
{
  public:
    explicit ScratchIndex(fs::path root) : root_(std::move(root))
    {
        std::error_code ignored;
        std::string folder = (fs::temp_directory_path(ignored) / "vclink-shell-XXXXXX").string();
        if (::mkdtemp(folder.data()) != nullptr)
        {
            folder_ = folder;
        }
    }
    ScratchIndex(const ScratchIndex &) = delete;
    ScratchIndex &operator=(const ScratchIndex &) = delete;
    ~ScratchIndex()
    {
        std::error_code ignored;
        fs::remove_all(folder_, ignored);
    }

    /// @throws ShellFailure
    std::string git(std::vector<std::string> arguments, const std::string &input = {}) const
    {
        const std::string variable = "GIT_INDEX_FILE=" + (folder_ / "index").string();
        const auto output =
            folder_.empty() ? std::nullopt : runGit(root_, std::move(arguments), input, {variable});
        if (!output)
        {
            throw ShellFailure(say("Nothing was reverted: git can't store what would be discarded. "
                                   "To discard it for good, use --forget."));
        }
        return *output;
    }
    /// The id of what the index holds.
    std::string writeTree() const
    {
        const std::string id = git({"write-tree"});
        return id.substr(0, id.find('\n'));
    }

  private:
    fs::path root_;
    fs::path folder_;
};

using Names = std::set<std::string>;

/// What is staged for these files and not in HEAD, as "git update-index --index-info" takes it.
std::string findStaged(const fs::path &root, const Names &names)
{
    if (names.empty())
    {
        return {};
    }
    // ":MODE MODE ID ID STATUS", the name, each with a NUL at its end.
    const std::string text =
        runGit(root, {"diff-index", "--cached", "--raw", "-z", "--no-renames", "HEAD"})
            .value_or("");
    std::string entries;
    for (std::size_t start = 0; start < text.size();)
    {
        const std::size_t middle = text.find('\0', start);
        const std::size_t end = text.find('\0', middle + 1);
        if (middle == std::string::npos || end == std::string::npos)
        {
            break;
        }
        const std::string record = text.substr(start, middle - start);
        const std::string name = text.substr(middle + 1, end - middle - 1);
        const std::string mode = record.substr(8, 6);
        const std::size_t id = record.find(' ', 15) + 1;
        if (names.count(name) != 0 && mode != "000000")
        {
            entries +=
                mode + ' ' + record.substr(id, record.find(' ', id) - id) + '\t' + name + '\0';
        }
        start = end + 1;
    }
    return entries;
}

bool isFile(const fs::path &path)
{
    std::error_code ignored;
    const fs::file_status status = fs::symlink_status(path, ignored);
    return fs::is_regular_file(status) || fs::is_symlink(status);
}

/// Adds what is in the place of a file: the file, a file or link where it has a folder, or all
/// files of a folder that has its name. The folder of a submodule stays.
void collectInPlace(const fs::path &root, const std::string &name, Names &found)
{
    fs::path place;
    for (const fs::path &element : fs::path(name))
    {
        place /= element;
        if (isFile(root / place))
        {
            found.insert(place.string());
            return;
        }
    }
    std::error_code error;
    const fs::path folder = root / name;
    if (!fs::is_directory(folder, error) || hasGitEntry(folder))
    {
        return;
    }
    for (fs::recursive_directory_iterator entry(folder, error), end; !error && entry != end;
         entry.increment(error))
    {
        if (isFile(entry->path()))
        {
            found.insert(entry->path().lexically_relative(root).string());
        }
    }
}

std::string join(const Names &names)
{
    std::string text;
    for (const std::string &name : names)
    {
        text += name + '\0';
    }
    return text;
}

/// Whether an index still holds these entries.
bool holds(const ScratchIndex &index, const std::string &entries)
{
    // "MODE ID STAGE", a tab, and the name.
    std::string all = index.git({"ls-files", "--stage", "-z"});
    for (std::size_t place = all.find(" 0\t"); place != std::string::npos;
         place = all.find(" 0\t", place))
    {
        all.erase(place, 2);
    }
    all.insert(0, 1, '\0');
    for (std::size_t start = 0; start < entries.size();)
    {
        const std::size_t end = entries.find('\0', start) + 1;
        if (all.find('\0' + entries.substr(start, end - start)) == std::string::npos)
        {
            return false;
        }
        start = end;
    }
    return true;
}

std::string describe(const std::string &sentence, const std::string &option,
                     const std::string &tree)
{
    return fill(sentence,
                {"git restore --overlay " + option + "--source=" + tree.substr(0, 12) + " :/"});
}

} // namespace

WayBack keepContents(CMAdapter &adapter, const FileStateMap &files)
{
    const fs::path root = nativePath(adapter.getRootFolder());
    Names added;
    Names others;
    Names addedOnDisk;
    Names othersOnDisk;
    for (const auto &[path, state] : files)
    {
        const std::string name =
            fl::i18n::ustring_to_utf8(relativeName(path, adapter.getRootFolder()));
        // What was only added stays on the disk.
        const bool isAdded = state.getState() == FileState::Added;
        (isAdded ? added : others).insert(name);
        collectInPlace(root, name, isAdded ? addedOnDisk : othersOnDisk);
    }
    const std::string stagedOfAdded = findStaged(root, added);
    const std::string stagedOfOthers = findStaged(root, others);
    const std::string staged = stagedOfAdded + stagedOfOthers;
    const bool isDiscarded = !stagedOfOthers.empty() || !othersOnDisk.empty();
    if (staged.empty() && !isDiscarded)
    {
        return {};
    }
    const ScratchIndex index(root);
    index.git({"read-tree", "--empty"});
    index.git({"update-index", "-z", "--index-info"}, staged);
    const std::string stagedTree = index.writeTree();
    index.git({"update-index", "-z", "--add", "--replace", "--stdin"},
              join(addedOnDisk) + join(othersOnDisk));
    WayBack wayBack;
    if (isDiscarded)
    {
        wayBack.files = describe(say("To restore what was discarded: %1%"), "", index.writeTree());
    }
    if (!staged.empty() && !holds(index, staged))
    {
        wayBack.staged = describe(say("To restore what was staged: %1%"), "--staged ", stagedTree);
    }
    return wayBack;
}

} // namespace vclink::shell
