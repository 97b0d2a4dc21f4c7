// SPDX-License-Identifier: MIT
#include "moves.hpp"

#include <algorithm>
#include <iterator>
#include <set>
#include <tuple>
#include <utility>

namespace vclink::test
{
namespace
{

using Changes = std::vector<IndexChange>;

constexpr int leastSimilarity = 50;

bool isRegular(const std::string &mode)
{
    return mode.compare(0, 3, "100") == 0;
}

bool mayBeMovedFrom(char letter, const std::string &headMode)
{
    return isRegular(headMode) && (letter == 'D' || letter == 'T');
}

bool mayBeMovedTo(char letter, const std::string &indexMode)
{
    return isRegular(indexMode) && (letter == 'A' || letter == 'T');
}

std::vector<std::string> sortedLines(const std::string &content)
{
    std::vector<std::string> lines;
    std::string line;
    for (const char character : content + '\n')
    {
        const bool ends = character == '\n' || character == '\0';
        if (!ends && character != '\r')
        {
            line += character;
        }
        if (ends && !line.empty())
        {
            lines.push_back(line);
            line.clear();
        }
    }
    std::sort(lines.begin(), lines.end());
    return lines;
}

/// How many of 100 lines two contents have in common.
int compareLines(const std::string &left, const std::string &right)
{
    const auto leftLines = sortedLines(left);
    const auto rightLines = sortedLines(right);
    std::vector<std::string> common;
    std::set_intersection(leftLines.begin(), leftLines.end(), rightLines.begin(), rightLines.end(),
                          std::back_inserter(common));
    const std::size_t all = leftLines.size() + rightLines.size();
    return all == 0 ? 0 : static_cast<int>(200 * common.size() / all);
}

struct Move
{
    int similarity;
    std::size_t from;
    std::size_t to;
};

std::vector<Move> compareAll(const Changes &changes, const Blobs &blobs)
{
    std::vector<Move> moves;
    for (std::size_t to = 0; to < changes.size(); ++to)
    {
        for (std::size_t from = 0; from < changes.size(); ++from)
        {
            const auto &source = changes[from];
            const auto &target = changes[to];
            if (from == to || !mayBeMovedFrom(source.letter, source.headMode) ||
                !mayBeMovedTo(target.letter, target.indexMode))
            {
                continue;
            }
            const auto left = blobs.find(source.headId);
            const auto right = blobs.find(target.indexId);
            const bool known = left != blobs.end() && right != blobs.end();
            const int lines = known ? compareLines(left->second, right->second) : 0;
            moves.push_back({source.headId == target.indexId ? 100 : lines, from, to});
        }
    }
    return moves;
}

/// The pairs that are most alike, each file in one at most; among equals the first by the new
/// path, then by the old one.
std::vector<Move> chooseMoves(const Changes &changes, const Blobs &blobs)
{
    std::vector<Move> moves = compareAll(changes, blobs);
    std::stable_sort(moves.begin(), moves.end(),
                     [](const Move &left, const Move &right)
                     { return left.similarity > right.similarity; });
    std::set<std::size_t> sources;
    std::set<std::size_t> targets;
    std::vector<Move> chosen;
    for (const auto &move : moves)
    {
        if (move.similarity >= leastSimilarity && sources.count(move.from) == 0 &&
            targets.count(move.to) == 0)
        {
            sources.insert(move.from);
            targets.insert(move.to);
            chosen.push_back(move);
        }
    }
    std::sort(chosen.begin(), chosen.end(),
              [](const Move &left, const Move &right) { return left.to < right.to; });
    return chosen;
}

/// What is left where a move came from, after it left with what HEAD had there: what HEAD had where
/// it went to, and the index as it is.
void describeRest(IndexChange &rest)
{
    const bool inHead = rest.headMode != noMode;
    const bool inIndex = rest.indexMode != noMode;
    rest.letter = inHead ? (inIndex ? 'T' : 'D') : (inIndex ? 'A' : '.');
    if (!inHead)
    {
        rest.path = rest.place;
    }
    if (!inIndex && inHead)
    {
        rest.place = rest.path;
    }
}

/// A move takes with it what HEAD has of the old place, its path included, and leaves there what
/// HEAD had of the new one.
void apply(const std::string &oldPath, IndexChange &target, Changes &changes)
{
    IndexChange &source =
        *std::find_if(changes.begin(), changes.end(),
                      [&oldPath](const IndexChange &change)
                      { return change.headMode != noMode && change.path == oldPath; });
    if (&source != &target)
    {
        std::swap(source.path, target.path);
        std::swap(source.headMode, target.headMode);
        std::swap(source.headId, target.headId);
        describeRest(source);
    }
    target.letter = 'R';
    target.edited = target.headId != target.indexId;
}

} // namespace

void joinMoves(Changes &changes, const Blobs &blobs)
{
    std::vector<std::pair<std::string, std::size_t>> moves;
    for (const auto &move : chooseMoves(changes, blobs))
    {
        moves.emplace_back(changes[move.from].path, move.to);
    }
    for (const auto &[oldPath, to] : moves)
    {
        apply(oldPath, changes[to], changes);
    }
    // If two are in one place, the deleted one is before the one that moved in.
    std::stable_sort(changes.begin(), changes.end(),
                     [](const IndexChange &left, const IndexChange &right)
                     {
                         return std::make_tuple(left.place, left.letter != 'D') <
                                std::make_tuple(right.place, right.letter != 'D');
                     });
}

std::vector<std::string> moveCandidates(const GitReport &report)
{
    std::vector<std::string> sources;
    std::vector<std::string> targets;
    for (const auto &[path, file] : report)
    {
        if (!file.unmerged && mayBeMovedFrom(file.index, file.headMode))
        {
            sources.push_back(file.headId);
        }
        if (!file.unmerged && mayBeMovedTo(file.index, file.indexMode))
        {
            targets.push_back(file.indexId);
        }
    }
    if (sources.empty() || targets.empty())
    {
        return {};
    }
    sources.insert(sources.end(), targets.begin(), targets.end());
    return sources;
}

} // namespace vclink::test
