// SPDX-License-Identifier: MIT
#include "Situation.hpp"

#include <map>

#include "imports.hpp"

namespace vclink::test
{
namespace
{

namespace fs = std::filesystem;

const Files committed{{"a first", "first\n"}, {"d/file", "deep\n"},     {"file", "of main\n"},
                      {"mine", "mine\n"},     {"other", "untouched\n"}, {"t/file", "of main\n"},
                      {"t/keep", "kept\n"},   {"zz last", "last\n"}};

const std::map<std::string, Files> branches{
    {"adds", {{"new", "theirs\n"}, {"t/new", "theirs\n"}, {"u/new", "theirs\n"}}},
    {"modifies", {{"file", "theirs\n"}, {"t/file", "theirs\n"}}},
    {"deletes", {{"file", "-"}, {"t/file", "-"}}},
    {"unrelated", {{"t/different", "theirs\n"}, {"u/different", "theirs\n"}}},
    {"folders",
     {{"new/a", "theirs\n"},
      {"t/new/a", "theirs\n"},
      {"u/new/a", "theirs\n"},
      {"file", "-"},
      {"file/a", "theirs\n"},
      {"t/file", "-"},
      {"t/file/a", "theirs\n"}}},
    {"files",
     {{"new", "theirs\n"}, {"t/file", "-"}, {"t/keep", "-"}, {"t/s/file", "-"}, {"t", "theirs\n"}}},
    {"ours", {{"mine", "of ours\n"}}}};

/// Siblings, as they are on a branch.
void addSiblings(Files &files, const std::string &branch)
{
    for (const auto *path : {"d", "file", "new", "t", "t/file", "t/new"})
    {
        const bool isInFile = branch == "files" && std::string(path).find('/') != std::string::npos;
        files[siblingOf(path)] = isInFile ? "-" : "sibling on " + branch + '\n';
    }
}

void make(const fs::path &folder, bool hasSiblings)
{
    const auto copy = GitRepository::init(folder / "copy");
    copy.write("../outside/file", "outside\n");
    copy.write("../outside/keep", "outside\n");
    copy.write("../outside/new", "outside\n");
    Files main = committed;
    if (hasSiblings)
        addSiblings(main, "main");
    std::string stream = commitOf("main", main);
    for (auto [branch, files] : branches)
    {
        if (branch != "ours")
        {
            files["a first"] = "first of " + branch + '\n';
            files["zz last"] = "last of " + branch + '\n';
            if (hasSiblings)
                addSiblings(files, branch);
        }
        stream += commitOf(branch, files);
    }
    importCommits(copy, stream);
}

void copyFiles(const fs::path &from, const fs::path &to)
{
    fs::copy(from, to, fs::copy_options::recursive | fs::copy_options::copy_symlinks);
}

/// Lets a linked "copy" and its "main" find each other, by absolute paths as git writes them.
void connectCopy(const fs::path &folder)
{
    const fs::path ownFolder = folder / "main/.git/worktrees/copy";
    const GitRepository copy(folder / "copy");
    copy.write(".git", "gitdir: " + ownFolder.string() + '\n');
    copy.write((ownFolder / "gitdir").string(), (folder / "copy/.git").string() + '\n');
}

} // namespace

const std::vector<Place> &allPlaces()
{
    constexpr bool common = true;
    constexpr bool rare = false;
    static const std::vector<Place> places{
        {"a new file", Holds::Nothing, common, "new", "adds"},
        {"a new file below a tracked folder", Holds::Nothing, rare, "t/new", "adds"},
        {"a new file below an untracked folder", Holds::Nothing, rare, "u/new", "adds"},
        {"at the top, left alone", Holds::Nothing, common, "new", "unrelated"},
        {"below a tracked folder, left alone", Holds::Nothing, rare, "t/new", "unrelated"},
        {"below an untracked folder, left alone", Holds::Nothing, rare, "u/new", "unrelated"},
        {"a new folder", Holds::Nothing, common, "new", "folders"},
        {"a new folder below a tracked one", Holds::Nothing, rare, "t/new", "folders"},
        {"in a folder where a file comes", Holds::Nothing, common, "new/x", "files"},
        {"in a tracked folder that becomes a file", Holds::Nothing, common, "t/new", "files"},
        {"a modified file", Holds::File, common, "file", "modifies"},
        {"a modified file below a folder", Holds::File, rare, "t/file", "modifies"},
        {"a deleted file", Holds::File, common, "file", "deletes"},
        {"a deleted file below a folder", Holds::File, rare, "t/file", "deletes"},
        {"a file left alone", Holds::File, common, "file", "unrelated"},
        {"a file left alone below a folder", Holds::File, rare, "t/file", "unrelated"},
        {"a file that becomes a folder", Holds::File, common, "file", "folders"},
        {"in a folder that becomes a file", Holds::File, common, "t/file", "files"},
        {"a folder with a modified file", Holds::Folder, common, "t", "modifies"},
        {"a folder with a deleted file", Holds::Folder, rare, "t", "deletes"},
        {"a folder with a new file", Holds::Folder, rare, "t", "adds"},
        {"a folder that becomes a file", Holds::Folder, common, "t", "files"},
        {"a folder left alone", Holds::Folder, rare, "d", "unrelated"},
    };
    return places;
}

void makeSurroundings(const fs::path &folder)
{
    make(folder, false);
}

void makeSurroundingsWithSiblings(const fs::path &folder)
{
    make(folder, true);
}

std::string siblingOf(const std::string &path)
{
    return path + "-b";
}

void linkSurroundings(const fs::path &folder)
{
    fs::rename(folder / "copy", folder / "main");
    const GitRepository main(folder / "main");
    main.git({"switch", "--quiet", "--detach"});
    main.git({"worktree", "add", "--quiet", "../copy", "main"});
    GitRepository(folder / "copy").git({"submodule", "--quiet", "update", "--init"});
}

void copySurroundings(const fs::path &from, const fs::path &to)
{
    fs::create_directories(to);
    copyFiles(from, to);
    if (fs::exists(to / "main"))
        connectCopy(to);
}

void clearSurroundings(const fs::path &original, const fs::path &folder)
{
    for (const auto &entry : fs::directory_iterator(folder / "copy"))
        if (entry.path().filename() != ".git")
            fs::remove_all(entry.path());
    for (const auto &entry : fs::directory_iterator(original / "copy"))
        if (entry.path().filename() != ".git")
            copyFiles(entry.path(), folder / "copy" / entry.path().filename());
    const fs::path from = GitRepository(original / "copy").gitFolder();
    const fs::path to = GitRepository(folder / "copy").gitFolder();
    fs::copy_file(from / "index", to / "index", fs::copy_options::overwrite_existing);
    if (fs::exists(from / "modules"))
    {
        fs::remove_all(to / "modules");
        copyFiles(from / "modules", to / "modules");
    }
}

} // namespace vclink::test
