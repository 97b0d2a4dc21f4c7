// SPDX-License-Identifier: MIT
#include "surroundingDifferences.hpp"

#include <algorithm>

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

} // namespace

bool SurroundingDifference::explains(const Comparand &comparand) const
{
    return holds(operations, comparand.operation) &&
           (obstacles.empty() || holds(obstacles, comparand.obstacle)) &&
           means(place, comparand.place) && git == comparand.git && library == comparand.library;
}

const std::vector<SurroundingDifference> &surroundingDifferences()
{
    const std::string through = "goes through";
    const std::string refusal = "refuses";
    const std::string otherwise = "leaves something else";
    const Names merge{"merge"};
    const Names safe{"switch", "fastForward"};
    const Names all{"merge", "switch", "fastForward"};
    const Names revert{"revert"};
    const Names missing{"missing", "left out and missing", "folder missing", "folder emptied"};
    static const std::vector<SurroundingDifference> differences{
        // The library refuses, though git goes on.
        {all, missing, "a *", through, refusal,
         "libgit2 takes a missing file that the other side touches for an edit"},
        {merge, missing, "in a folder that becomes a file", through, refusal,
         "libgit2 takes a missing file that the other side touches for an edit"},
        {{"switch"},
         {"staged deletion"},
         "a file that becomes a folder",
         through,
         refusal,
         "libgit2 takes a file that is gone from the index for an edit"},
        {merge,
         {},
         "a file left alone*",
         through,
         refusal,
         "a merge checks out by force, and would put back what the user has changed"},
        {merge,
         {},
         "a folder left alone",
         through,
         refusal,
         "a merge checks out by force, and would put back what the user has changed"},
        {all,
         {"pipe", "socket", "empty folder"},
         "in a *",
         through,
         refusal,
         "git removes the pipe, the socket or the empty folder"},
        {{"switch"},
         {"ignored link"},
         "a new file",
         through,
         refusal,
         "an ignored link is not overwritten, because it would be written through"},
        {safe,
         {"ignored file", "ignored link"},
         "a new folder*",
         through,
         refusal,
         "libgit2 overwrites an ignored file with a file, but not with a folder"},
        {{"switch"},
         {"link to nothing in the folder's place"},
         "a folder with a modified file",
         through,
         refusal,
         "git removes the link"},
        {safe,
         {"staged edit", "staged executable"},
         "in a folder that becomes a file",
         through,
         refusal,
         "git drops what is staged below the folder"},
        {safe,
         {"staged new file"},
         "in a *",
         through,
         refusal,
         "git drops what is staged below the folder"},
        // git refuses, though nothing is lost.
        {safe,
         {"folder in its place", "empty folder in its place"},
         "a deleted file*",
         refusal,
         through,
         "the folder stays, and the file is gone already"},
        {{"switch"},
         {"empty folder in its place"},
         "a file that becomes a folder",
         refusal,
         through,
         "an empty folder is in nobody's way"},
        {{"switch"},
         {"not tracked any more"},
         "in a folder that becomes a file",
         refusal,
         through,
         "the file holds what the commit has"},
        {{"switch"},
         {"not tracked any more"},
         "a *",
         refusal,
         through,
         "the file holds what the commit has"},
        {merge,
         {"not tracked any more"},
         "a deleted file below a folder",
         refusal,
         through,
         "both sides have deleted the file, which holds what the commit has"},
        {merge,
         {"staged deletion"},
         "a deleted file*",
         refusal,
         through,
         "both sides have deleted the file; git refuses over whatever is staged"},
        {merge,
         {"staged deletion"},
         "in a folder that becomes a file",
         refusal,
         through,
         "both sides have deleted the file; git refuses over whatever is staged"},
        // Both go on.
        {merge, missing, "a f*", through, otherwise,
         "a merge puts back missing files, where there is nothing to lose"},
        {merge,
         {"empty folder in its place"},
         "a file left alone*",
         through,
         otherwise,
         "a merge puts back missing files, where there is nothing to lose"},
        {{"switch", "fastForward", "revert of another file"},
         {"left out and edited"},
         "a file left alone*",
         through,
         otherwise,
         "git takes a present file for no longer left out; libgit2 knows no sparse checkout"},
        {revert,
         {"staged new file", "staged and edited new file"},
         "*",
         through,
         otherwise,
         "a revert takes a new file out of the index and leaves it on disk"},
        {revert,
         {"link in its place", "link in the folder's place"},
         "a f*",
         through,
         otherwise,
         "a link in a list means what it leads to"},
        {revert,
         {"left out and missing", "assumed unchanged and edited"},
         "a file left alone*",
         through,
         otherwise,
         "a revert takes the mark away"},
    };
    return differences;
}

} // namespace vclink::test
