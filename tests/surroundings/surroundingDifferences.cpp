// SPDX-License-Identifier: MIT
#include "surroundingDifferences.hpp"

#include <algorithm>

#include "support/gitRelease.hpp"

namespace vclink::test
{
namespace
{

using Names = std::vector<std::string>;

bool holds(const Names &names, const std::string &name)
{
    return std::find(names.begin(), names.end(), name) != names.end();
}

bool means(const std::string &pattern, const std::string &text)
{
    if (pattern.empty() || pattern.back() != '*')
        return pattern == text;
    return text.compare(0, pattern.size() - 1, pattern, 0, pattern.size() - 1) == 0;
}

/// Differences with one reason.
struct Reason
{
    std::string text;
    std::string git;
    std::string library;
    struct Where
    {
        Names operations;
        Names obstacles;
        std::string place;
    };
    std::vector<Where> places;
    bool isOfSiblings = false;
};

/// Reasons that apply only to some releases of git.
std::vector<Reason> reasonsByRelease()
{
    if (!git_release::deletesIgnoredFolders())
        return {};
    return {{"git deletes what is ignored below a folder that becomes a file",
             "goes through",
             "refuses",
             {{{"merge", "switch", "fastForward"},
               {"ignored file", "ignored link", "ignored folder", "folder with ignored files"},
               "in a *"}}},
            {"git deletes a folder with ignored files if a file comes in its place",
             "goes through",
             "refuses",
             {{{"merge", "switch"}, {"folder with ignored files"}, "a new file*"}}}};
}

// One table. NOLINTNEXTLINE(readability-function-size)
std::vector<Reason> reasonsOfAnyGit()
{
    const std::string through = "goes through";
    const std::string refusal = "refuses";
    const std::string otherwise = "leaves something else";
    const Names merge{"merge"};
    const Names safe{"switch", "fastForward"};
    const Names all{"merge", "switch", "fastForward"};
    const Names revert{"revert"};
    const Names missing{"missing", "left out and missing", "folder missing", "folder emptied"};
    const std::string conflicts = "stops in conflicts";
    const Names modules{"merge of submodules", "fast-forward of submodules",
                        "switch of submodules"};
    const Names moduleMerge{"merge of submodules"};
    const Names moduleSwitch{"switch of submodules"};
    const Names movedMerge{"merge into moved submodules"};
    const Names addedMerge{"merge into added submodules"};
    const Names removedMerge{"merge into removed submodules"};
    const Names replacedMerge{"merge into replaced submodules"};
    const Names unfoldedMerge{"merge into unfolded submodules"};
    const Names movedOrAdded{"merge into moved submodules", "merge into added submodules"};
    const Names otherKinds{"file in the submodule's place", "link in the submodule's place",
                           "pipe in the submodule's place"};
    return {
        {"libgit2 merges into no file that has changed; git leaves its conflict beside it",
         conflicts,
         refusal,
         {{unfoldedMerge, {"file in the folder's place", "folder missing"}, "a submodule that *"}}},
        {"a merge checks out by force, and would put back what the user has changed",
         through,
         refusal,
         {{unfoldedMerge, {"file in the folder's place"}, "a submodule that *"},
          {unfoldedMerge,
           {"edit", "folder in its place"},
           "below a submodule that ours made a folder"},
          {merge, {}, "a file left alone*"},
          {merge, {}, "a folder left alone"},
          {replacedMerge, {}, "a submodule that ours made a file"}}},
        {"libgit2 takes a missing file that the other side touches for an edit",
         through,
         refusal,
         {{all, missing, "a *"},
          {merge, missing, "in a folder that becomes a file"},
          {moduleMerge, {"missing"}, "*"}}},
        {"libgit2 takes a file that is gone from the index for an edit",
         through,
         refusal,
         {{{"switch"}, {"staged deletion"}, "a file that becomes a folder"}}},
        {"git removes the pipe, the socket or the empty folder",
         through,
         refusal,
         {{all, {"pipe", "socket", "empty folder"}, "in a *"}}},
        {"an ignored link is not overwritten, because it would be written through",
         through,
         refusal,
         {{{"switch"}, {"ignored link"}, "a new file"}}},
        {"libgit2 overwrites an ignored file with a file, but not with a folder",
         through,
         refusal,
         {{safe, {"ignored file", "ignored link"}, "a new folder*"}}},
        {"git removes the link",
         through,
         refusal,
         {{{"switch"},
           {"link to nothing in the folder's place"},
           "a folder with a modified file"}}},
        {"git drops what is staged below the folder",
         through,
         refusal,
         {{safe, {"staged edit", "staged executable"}, "in a folder that becomes a file"},
          {safe, {"staged new file"}, "in a *"}}},
        {"libgit2 takes the missing folder of a submodule for an edit",
         through,
         refusal,
         {{modules, {"submodule missing"}, "a moved submodule"},
          {movedMerge, {"submodule missing"}, "a submodule that *"},
          {moduleMerge, {"submodule missing"}, "a re*"},
          {moduleMerge, {"submodule missing"}, "a submodule that becomes a f*"}}},
        {"libgit2 takes the missing folder of a submodule for an edit",
         conflicts,
         refusal,
         {{movedMerge, {"submodule missing"}, "a submodule that they *"},
          {addedMerge, {"submodule missing"}, "a submodule *"}}},
        {"git gives what comes another name; libgit2 would delete the folder",
         conflicts,
         refusal,
         {{movedMerge, {}, "a submodule that they made a f*"}}},
        {"libgit2 takes what is in a submodule's place for an edit",
         through,
         refusal,
         {{movedOrAdded, otherKinds, "a submodule *"},
          {moduleMerge, otherKinds, "a *"},
          {moduleSwitch, otherKinds, "a moved submodule"},
          {moduleSwitch, otherKinds, "a submodule that becomes a folder"}}},
        {"libgit2 takes what is in a submodule's place for an edit",
         conflicts,
         refusal,
         {{movedOrAdded, otherKinds, "a submodule *"}}},
        {"what is in the place of a submodule that ours removed is taken for an edit",
         conflicts,
         refusal,
         {{removedMerge, {}, "a submodule that they *"}}},
        {"libgit2 takes any change of what the other side touches for an edit",
         conflicts,
         refusal,
         {{replacedMerge, {}, "a submodule that *"}}},
        {"a pipe refuses every checkout that touches it",
         through,
         refusal,
         {{moduleSwitch, {"pipe in the submodule's place"}, "a re*"}}},
        {"git deletes the submodule with all that it holds",
         through,
         refusal,
         {{{"merge of submodules", "switch of submodules"},
           {},
           "a submodule that becomes a file"}}},
        {"what comes would be mixed with what is in the submodule's place",
         through,
         refusal,
         {{{"merge of submodules", "switch of submodules"},
           {"plain folder"},
           "a submodule that becomes a folder"}}},
        {"an empty folder is in nobody's way",
         refusal,
         through,
         {{moduleSwitch, {"empty folder in its place"}, "a file that becomes a submodule"},
          {{"switch"}, {"empty folder in its place"}, "a deleted file*"},
          {{"switch"}, {"empty folder in its place"}, "a file that becomes a folder"}}},
        {"git deletes what is ignored; libgit2 fails at it while it writes",
         through,
         refusal,
         {{{"merge of submodules", "switch of submodules"},
           {"ignored file", "ignored link"},
           "a new submodule*"}}},
        {"libgit2 takes missing files that the other side touches for edits",
         through,
         refusal,
         {{{"merge of submodules", "switch of submodules"},
           {"folder missing"},
           "a folder that becomes a submodule"}}},
        {"libgit2 takes what is untracked in the folder for a part of the submodule",
         through,
         refusal,
         {{moduleMerge, {}, "new in a folder that becomes a submodule"}}},
        {"git drops the submodule from the index",
         through,
         refusal,
         {{moduleSwitch, {"staged new file"}, "new in a folder that becomes a submodule"}}},
        {"git takes the newer commit; to libgit2 a submodule that both moved is in conflict",
         through,
         conflicts,
         {{movedMerge, {}, "a submodule that both moved"}}},
        {"git deletes the file; libgit2 fails at it while it writes",
         through,
         refusal,
         {{{"revert of submodules"}, {"file in the submodule's place"}, "a submodule left alone"}}},
        {"libgit2 would delete the folder, because a sibling is sorted before it",
         through,
         refusal,
         {{moduleMerge, {}, "a re*"}, {moduleMerge, {}, "a submodule that becomes a f*"}},
         true},
        {"libgit2 is past what is in the way, and would fail at it while it writes",
         through,
         refusal,
         {{merge, {"ignored folder"}, "a new file"},
          {merge, {"ignored file"}, "a new folder*"},
          {revert, {"folder in its place"}, "a file left alone*"},
          {revert, {"file in the folder's place"}, "a folder left alone"}},
         true},
        {"both sides have deleted the file; git refuses over whatever is staged",
         refusal,
         through,
         {{merge, {"staged deletion"}, "a deleted file*"},
          {merge, {"staged deletion"}, "in a folder that becomes a file"}}},
        {"both sides have removed the submodule; git refuses over whatever is staged",
         refusal,
         through,
         {{moduleMerge, {"taken out of the index", "taken out and removed"}, "a re*"},
          {movedMerge, {"taken out and removed"}, "a submodule that they renamed"}}},
        {"nothing but a removal is staged, and the conflict can be solved by it",
         refusal,
         conflicts,
         {{movedOrAdded, {"taken out and removed"}, "a submodule *"}}},
        {"a merge puts back the folder of a submodule that is missing",
         through,
         otherwise,
         {{moduleMerge, {"submodule missing"}, "a submodule left alone"},
          {movedOrAdded, {"submodule missing"}, "a submodule that *"}}},
        {"git gives the file another name; libgit2 leaves both at one",
         conflicts,
         otherwise,
         {{addedMerge, {}, "a submodule where they added a file"}}},
        {"git gives one side another name; libgit2 leaves both at theirs",
         conflicts,
         otherwise,
         {{movedMerge, {"not populated"}, "a submodule that they made a f*"}}},
        {"git makes an empty folder for a submodule in conflict, and takes a removal and a "
         "renaming "
         "for one conflict",
         conflicts,
         otherwise,
         {{removedMerge, {}, "a submodule that they *"}}},
        {"a merge puts back missing files, where there is nothing to lose",
         through,
         otherwise,
         {{replacedMerge,
           {"missing", "empty folder in its place"},
           "a submodule that ours made a file"},
          {merge, missing, "a f*"},
          {merge, {"empty folder in its place"}, "a file left alone*"},
          {unfoldedMerge, {"folder missing"}, "a submodule that *"},
          {unfoldedMerge,
           {"missing", "empty folder in its place"},
           "below a submodule that ours made a folder"}}},
        {"git takes a present file for no longer left out; libgit2 knows no sparse checkout",
         through,
         otherwise,
         {{{"switch", "fastForward", "revert of another file"},
           {"left out and edited"},
           "a file left alone*"}}},
        {"a revert takes a new file out of the index and leaves it on disk",
         through,
         otherwise,
         {{revert, {"staged new file", "staged and edited new file"}, "*"}}},
        {"a link in a list means what it leads to",
         through,
         otherwise,
         {{{"revert of submodules"}, {"link in the submodule's place"}, "a submodule left alone"},
          {revert, {"link in its place", "link in the folder's place"}, "a f*"}}},
        {"a revert takes the mark away",
         through,
         otherwise,
         {{revert,
           {"left out and missing", "assumed unchanged and edited"},
           "a file left alone*"}}}};
}

std::vector<SurroundingDifference> makeDifferences()
{
    std::vector<SurroundingDifference> differences;
    for (const auto &reasons : {reasonsOfAnyGit(), reasonsByRelease()})
        for (const auto &reason : reasons)
            for (const auto &where : reason.places)
                differences.push_back({where.operations, where.obstacles, where.place, reason.git,
                                       reason.library, reason.text, reason.isOfSiblings});
    return differences;
}

} // namespace

bool SurroundingDifference::explains(const Comparand &comparand) const
{
    return isAbout(comparand) && (obstacles.empty() || holds(obstacles, comparand.obstacle)) &&
           git == comparand.git && library == comparand.library;
}

bool SurroundingDifference::isAbout(const Comparand &comparand) const
{
    return holds(operations, comparand.operation) && means(place, comparand.place) &&
           (comparand.hasSiblings || !isOfSiblings);
}

const std::vector<SurroundingDifference> &surroundingDifferences()
{
    static const std::vector<SurroundingDifference> differences = makeDifferences();
    return differences;
}

} // namespace vclink::test
