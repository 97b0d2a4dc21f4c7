// SPDX-License-Identifier: MIT
#include "Situation.hpp"

#include <map>

#include "imports.hpp"

namespace vclink::test
{
namespace
{

namespace fs = std::filesystem;

const std::string twoModules = "[submodule \"s\"]\n\tpath = s\n\turl = ../source\n"
                               "[submodule \"t/s\"]\n\tpath = t/s\n\turl = ../source\n";
const std::string moreModules =
    twoModules + "[submodule \"new\"]\n\tpath = new\n\turl = ../source\n";
const std::string renamedModules = "[submodule \"s\"]\n\tpath = r\n\turl = ../source\n"
                                   "[submodule \"t/s\"]\n\tpath = t/r\n\turl = ../source\n";

/// The submodules' commits, by the names of the branches of "source".
using Commits = std::map<std::string, std::string>;

Files filesOfMain(const Commits &at)
{
    return {{"a first", "first\n"}, {"d/file", "deep\n"},        {"d/other", "deep too\n"},
            {"file", "of main\n"},  {"mine", "mine\n"},          {"t/keep", "kept\n"},
            {"zz last", "last\n"},  {".gitmodules", twoModules}, {"s", at.at("first")},
            {"t/s", at.at("first")}};
}

std::map<std::string, Files> filesOfBranches(const Commits &at)
{
    const std::string gone = "-";
    const std::string &first = at.at("first");
    const std::string &second = at.at("second");
    const std::string &third = at.at("third");
    return {
        {"adds",
         {{".gitmodules", moreModules}, {"new", first}, {"t/new", first}, {"u/new", first}}},
        {"adds-another",
         {{".gitmodules", moreModules}, {"new", second}, {"t/new", second}, {"u/new", second}}},
        {"adds-file", {{"new", "theirs\n"}}},
        {"moves", {{"s", second}, {"t/s", second}}},
        {"moves-alike", {{"s", third}, {"t/s", third}}},
        {"removes", {{".gitmodules", gone}, {"s", gone}, {"t/s", gone}}},
        {"renames",
         {{".gitmodules", renamedModules},
          {"s", gone},
          {"t/s", gone},
          {"r", first},
          {"t/r", first}}},
        {"files", {{"s", "theirs\n"}}},
        {"folders", {{"s", gone}, {"s/inner", "theirs\n"}}},
        {"unrelated", {{"t/different", "theirs\n"}}},
        {"takes", {{"file", first}, {"d/file", gone}, {"d/other", gone}, {"d", first}}},
        {"ours", {{"mine", "of ours\n"}}},
        {"ours-adds",
         {{"mine", "of ours\n"},
          {".gitmodules", moreModules},
          {"new", first},
          {"t/new", first},
          {"u/new", first}}},
        {"ours-files", {{"mine", "of ours\n"}, {"s", "ours\n"}}},
        {"ours-folders", {{"mine", "of ours\n"}, {"s", gone}, {"s/inner", "ours\n"}}},
        {"ours-moves", {{"mine", "of ours\n"}, {"s", third}, {"t/s", third}}},
        {"ours-removes",
         {{"mine", "of ours\n"}, {".gitmodules", gone}, {"s", gone}, {"t/s", gone}}},
    };
}

/// Siblings, as they are on a branch.
void addModuleSiblings(Files &files, const std::string &branch)
{
    for (const auto *path : {"d", "file", "new", "r", "s", "t/new", "t/r", "t/s"})
        files[siblingOf(path)] = "sibling on " + branch + '\n';
}

/// @return its commits: each follows the one before
Commits makeSource(const fs::path &folder)
{
    auto source = GitRepository::init(folder);
    Commits commits;
    for (const std::string name : {"first", "second", "third"})
    {
        source.write("inner", name + '\n');
        commits[name] = source.commitAll(name);
    }
    return commits;
}

void makeWithSubmodules(const fs::path &folder, bool hasSiblings)
{
    const Commits commits = makeSource(folder / "source");
    const auto copy = GitRepository::init(folder / "copy");
    Files main = filesOfMain(commits);
    if (hasSiblings)
        addModuleSiblings(main, "main");
    std::string stream = commitOf("main", main);
    for (auto [branch, files] : filesOfBranches(commits))
    {
        if (branch.compare(0, 4, "ours") != 0)
        {
            files["a first"] = "first of " + branch + '\n';
            files["zz last"] = "last of " + branch + '\n';
            if (hasSiblings)
                addModuleSiblings(files, branch);
        }
        stream += commitOf(branch, files);
    }
    importCommits(copy, stream);
    copy.git({"submodule", "--quiet", "update", "--init"});
}

void emptyIt(const GitRepository &copy)
{
    copy.remove("s");
    copy.makeFolder("s");
}

} // namespace

const std::vector<Place> &submodulePlaces()
{
    constexpr bool common = true;
    constexpr bool rare = false;
    constexpr auto submodule = Holds::Submodule;
    static const std::vector<Place> places{
        {"a moved submodule", submodule, common, "s", "moves"},
        {"a removed submodule", submodule, common, "s", "removes"},
        {"a removed submodule below a folder", submodule, rare, "t/s", "removes"},
        {"a renamed submodule", submodule, common, "s", "renames"},
        {"a submodule that becomes a file", submodule, common, "s", "files", emptyIt},
        {"a submodule that becomes a folder", submodule, common, "s", "folders", emptyIt},
        {"a submodule left alone", submodule, common, "s", "unrelated"},
        {"a new submodule", Holds::Nothing, common, "new", "adds"},
        {"a new submodule below a tracked folder", Holds::Nothing, rare, "t/new", "adds"},
        {"a new submodule below an untracked folder", Holds::Nothing, rare, "u/new", "adds"},
        {"a file that becomes a submodule", Holds::File, common, "file", "takes"},
        {"in a folder that becomes a submodule", Holds::File, rare, "d/file", "takes"},
        {"new in a folder that becomes a submodule", Holds::Nothing, common, "d/new", "takes"},
        {"a folder that becomes a submodule", Holds::Folder, common, "d", "takes"},
    };
    return places;
}

const std::vector<Place> &addedSubmodulePlaces()
{
    constexpr bool common = true;
    constexpr auto submodule = Holds::Submodule;
    static const std::vector<Place> places{
        {"a submodule that both added", submodule, common, "new", "adds"},
        {"a submodule that both added with other commits", submodule, common, "new",
         "adds-another"},
        {"a submodule where they added a file", submodule, common, "new", "adds-file"},
        {"a submodule that ours added", submodule, common, "new", "unrelated"},
    };
    return places;
}

const std::vector<Place> &movedSubmodulePlaces()
{
    constexpr bool common = true;
    constexpr auto submodule = Holds::Submodule;
    static const std::vector<Place> places{
        {"a submodule that both moved", submodule, common, "s", "moves"},
        {"a submodule that both moved alike", submodule, common, "s", "moves-alike"},
        {"a submodule that they removed", submodule, common, "s", "removes"},
        {"a submodule that they renamed", submodule, common, "s", "renames"},
        {"a submodule that they made a file", submodule, common, "s", "files", emptyIt},
        {"a submodule that they made a folder", submodule, common, "s", "folders", emptyIt},
        {"a submodule that ours moved", submodule, common, "s", "unrelated"},
    };
    return places;
}

const std::vector<Place> &removedSubmodulePlaces()
{
    constexpr bool common = true;
    constexpr bool rare = false;
    constexpr auto nothing = Holds::Nothing;
    static const std::vector<Place> places{
        {"a submodule that both removed", nothing, common, "s", "removes"},
        {"a submodule that both removed below a folder", nothing, rare, "t/s", "removes"},
        {"a submodule that they moved", nothing, common, "s", "moves"},
        {"a submodule that they renamed", nothing, common, "s", "renames"},
        {"a submodule that they made a file", nothing, common, "s", "files"},
        {"a submodule that they made a folder", nothing, common, "s", "folders"},
        {"a submodule that ours removed", nothing, common, "s", "unrelated"},
    };
    return places;
}

const std::vector<Place> &replacedSubmodulePlaces()
{
    constexpr bool common = true;
    constexpr auto file = Holds::File;
    static const std::vector<Place> places{
        {"a submodule that both made a file", file, common, "s", "files"},
        {"a submodule that they made a folder", file, common, "s", "folders"},
        {"a submodule that they moved", file, common, "s", "moves"},
        {"a submodule that they removed", file, common, "s", "removes"},
        {"a submodule that ours made a file", file, common, "s", "unrelated"},
    };
    return places;
}

const std::vector<Place> &unfoldedSubmodulePlaces()
{
    constexpr bool common = true;
    constexpr bool rare = false;
    static const std::vector<Place> places{
        {"a submodule that both made a folder", Holds::Folder, common, "s", "folders"},
        {"below a submodule that both made a folder", Holds::File, rare, "s/inner", "folders"},
        {"a submodule that they made a file", Holds::Folder, common, "s", "files"},
        {"a submodule that they moved", Holds::Folder, common, "s", "moves"},
        {"below a submodule that they moved", Holds::File, rare, "s/inner", "moves"},
        {"a submodule that they removed", Holds::Folder, common, "s", "removes"},
        {"below a submodule that they removed", Holds::File, rare, "s/inner", "removes"},
        {"a submodule that they renamed", Holds::Folder, common, "s", "renames"},
        {"a submodule that ours made a folder", Holds::Folder, common, "s", "unrelated"},
        {"below a submodule that ours made a folder", Holds::File, common, "s/inner", "unrelated"},
        {"new below a submodule that ours made a folder", Holds::Nothing, common, "s/new",
         "unrelated"},
    };
    return places;
}

void makeSubmoduleSurroundings(const fs::path &folder)
{
    makeWithSubmodules(folder, false);
}

void makeSubmoduleSurroundingsWithSiblings(const fs::path &folder)
{
    makeWithSubmodules(folder, true);
}

} // namespace vclink::test
