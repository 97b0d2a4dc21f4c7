// SPDX-License-Identifier: MIT
#include "storedObjects.hpp"

#include <algorithm>
#include <cstddef>
#include <cstdio>
#include <map>
#include <system_error>

#include <unistd.h>

#include "gitProgram.hpp"
#include "texts.hpp"

namespace vclink::shell
{
namespace
{

namespace fs = std::filesystem;

/// Who says something is told too: it may be in another language.
/// @throws StoreFailure
void require(const std::string &program, const std::optional<std::string> &failure)
{
    if (failure)
    {
        const std::string text = failure->substr(0, failure->find('\n'));
        const std::string begin = program + ": ";
        throw StoreFailure(text.rfind(begin, 0) == 0 ? text : begin + text);
    }
}

std::vector<std::string> lines(const std::string &text)
{
    std::vector<std::string> found;
    for (std::size_t start = 0; start < text.size();)
    {
        const std::size_t end = std::min(text.find('\n', start), text.size());
        found.push_back(text.substr(start, end - start));
        start = end + 1;
    }
    return found;
}

/// A name on a line, as git reads it.
std::string quoteForGit(const std::string &name)
{
    std::string text = "\"";
    for (const char letter : name)
    {
        char escape[8];
        std::snprintf(escape, sizeof escape, "\\%03o", static_cast<unsigned char>(letter));
        const bool isPlain = letter >= ' ' && letter != '"' && letter != '\\' && letter != '\x7F';
        text += isPlain ? std::string(1, letter) : escape;
    }
    return text + '"';
}

/// Each folder with its own entries, as git's mktree reads them: "MODE TYPE ID", a tab, the name,
/// and a NUL.
using Folders = std::map<fs::path, std::string>;

Folders groupByFolder(const std::vector<StagedChange> &files)
{
    Folders folders{{fs::path(), ""}};
    for (const StagedChange &file : files)
    {
        const fs::path path = file.name;
        const char *const type = file.mode == submoduleMode ? " commit " : " blob ";
        folders[path.parent_path()] +=
            file.mode + type + file.id + '\t' + path.filename().string() + '\0';
        for (fs::path folder = path.parent_path(); !folder.empty(); folder = folder.parent_path())
        {
            folders.try_emplace(folder);
        }
    }
    return folders;
}

/// One run of git for all folders that are as deep as the deepest, which then are entries of
/// others.
/// @return the id of the last one
std::string storeDeepest(const fs::path &root, Folders &folders)
{
    const auto depth = [](const fs::path &path) { return std::distance(path.begin(), path.end()); };
    const auto deepest = std::max_element(folders.begin(), folders.end(),
                                          [&](const auto &left, const auto &right)
                                          { return depth(left.first) < depth(right.first); });
    const auto level = depth(deepest->first);
    std::string input;
    std::vector<fs::path> paths;
    for (auto folder = folders.begin(); folder != folders.end();)
    {
        if (depth(folder->first) != level)
        {
            ++folder;
            continue;
        }
        input += folder->second + '\0';
        paths.push_back(folder->first);
        folder = folders.erase(folder);
    }
    const MemoryFile in(input);
    const MemoryFile out;
    require("git", runProgram(gitWords(root, {"mktree", "-z", "--missing", "--batch"}), in, out));
    const std::vector<std::string> ids = lines(out.read());
    if (ids.size() != paths.size())
    {
        throw StoreFailure("git mktree");
    }
    for (std::size_t index = 0; index < ids.size() && level > 0; ++index)
    {
        folders[paths[index].parent_path()] +=
            "040000 tree " + ids[index] + '\t' + paths[index].filename().string() + '\0';
    }
    return ids.back();
}

bool isOfThisMode(const fs::path &path, const std::string &mode)
{
    std::error_code ignored;
    const fs::file_status status = fs::symlink_status(path, ignored);
    constexpr const char *link = "120000";
    if (fs::is_symlink(status) || !fs::is_regular_file(status) || mode == link)
    {
        return fs::is_symlink(status) && mode == link;
    }
    const bool isExecutable = (status.permissions() & fs::perms::owner_exec) != fs::perms::none;
    return mode == (isExecutable ? "100755" : "100644");
}

std::string hashLink(const fs::path &root, const fs::path &link)
{
    std::error_code ignored;
    const auto id =
        runGit(root, {"hash-object", "--stdin"}, fs::read_symlink(link, ignored).string());
    return id.value_or("").substr(0, 40);
}

} // namespace

std::string storeArchive(const fs::path &root, const std::vector<std::string> &names)
{
    std::string list;
    for (const std::string &name : names)
    {
        list += name + '\0';
    }
    const MemoryFile in(list);
    const MemoryFile archive;
    require("tar",
            runProgram({"tar", "--create", "--directory=" + root.string(), "--no-recursion",
                        "--hard-dereference", "--null", "--verbatim-files-from", "--files-from=-"},
                       in, archive));
    archive.rewind();
    const MemoryFile id;
    require("git", runProgram(gitWords(root, {"hash-object", "-w", "--no-filters", "--stdin"}),
                              archive, id));
    return id.read().substr(0, 40);
}

std::string storeTree(const fs::path &root, const std::vector<StagedChange> &files)
{
    Folders folders = groupByFolder(files);
    std::string id;
    while (!folders.empty())
    {
        id = storeDeepest(root, folders);
    }
    return id;
}

std::vector<StagedChange> selectOthersThanOnDisk(const fs::path &root,
                                                 const std::vector<StagedChange> &files,
                                                 Filters filters)
{
    std::vector<StagedChange> others;
    std::vector<StagedChange> regular;
    std::string names;
    for (const StagedChange &file : files)
    {
        const fs::path path = root / file.name;
        if (!isOfThisMode(path, file.mode))
        {
            others.push_back(file);
        }
        else if (file.mode == "120000")
        {
            others.insert(others.end(), hashLink(root, path) == file.id ? 0 : 1, file);
        }
        else
        {
            regular.push_back(file);
            names += quoteForGit(file.name) + '\n';
        }
    }
    std::vector<std::string> arguments{"hash-object", "--stdin-paths"};
    if (filters == Filters::Ignored)
    {
        arguments.emplace_back("--no-filters");
    }
    const auto output = runGit(root, arguments, names);
    const std::vector<std::string> ids = lines(output.value_or(""));
    for (std::size_t index = 0; index < regular.size(); ++index)
    {
        if (index >= ids.size() || ids[index] != regular[index].id)
        {
            others.push_back(regular[index]);
        }
    }
    return others;
}

} // namespace vclink::shell
