// SPDX-License-Identifier: MIT
#include "MergeHistory.hpp"

#include <set>
#include <sstream>
#include <stdexcept>
#include <utility>

#include "quoting.hpp"

namespace vclink::test
{
namespace
{

constexpr std::size_t tipCount = 3;
constexpr std::size_t firstCommit = 1'577'836'800;

const TreeFile *find(const Tree &tree, const std::string &path)
{
    const auto found = tree.find(path);
    return found == tree.end() ? nullptr : &found->second;
}

bool areEqual(const TreeFile *left, const TreeFile *right)
{
    return left == nullptr || right == nullptr ? left == right : *left == *right;
}

std::set<std::string> pathsOf(const Tree &left, const Tree &right)
{
    std::set<std::string> paths;
    for (const auto *tree : {&left, &right})
    {
        for (const auto &[path, file] : *tree)
        {
            paths.insert(path);
        }
    }
    return paths;
}

} // namespace

MergeHistory::MergeHistory(std::uint64_t seed, std::size_t merges) : random_(seed)
{
    tips_.assign(tipCount, commit("first", {}, edits_.makeTree()));
    for (std::size_t kind = 0; merges_ < merges; ++kind)
    {
        addMerges(MergeEdits::kinds()[kind % MergeEdits::kinds().size()]);
    }
    for (std::size_t tip = 0; tip < tipCount; ++tip)
    {
        stream_ += "reset refs/heads/tip" + std::to_string(tip) +
                   "\nfrom :" + std::to_string(tips_[tip] + 1) + "\n\n";
    }
    stream_ += "done\n";
}

void MergeHistory::importInto(const GitRepository &repository) const
{
    repository.command({"fast-import", "--quiet", "--done", "--force"}).input(stream_).runOrThrow();
    repository.git({"symbolic-ref", "HEAD", "refs/heads/tip0"});
    repository.git({"update-ref", "-d", "refs/heads/written"});
}

MergeHistory::Number MergeHistory::commit(const std::string &subject,
                                          const std::vector<Number> &parents, Tree tree)
{
    const Number number = commits_.size();
    const std::string time = std::to_string(firstCommit + 60 * number);
    stream_ += "commit refs/heads/written\nmark :" + std::to_string(number + 1) +
               "\ncommitter Author <author@example.com> " + time + " +0000\n" +
               asFastImportData(subject);
    std::vector<bool> ancestors(number);
    for (const auto parent : parents)
    {
        stream_ +=
            (parent == parents.front() ? "from :" : "merge :") + std::to_string(parent + 1) + '\n';
        ancestors[parent] = true;
        const auto &further = commits_[parent].ancestors;
        for (Number ancestor = 0; ancestor < further.size(); ++ancestor)
        {
            ancestors[ancestor] = ancestors[ancestor] || further[ancestor];
        }
    }
    writeTree(parents.empty() ? Tree() : commits_[parents.front()].tree, tree);
    commits_.push_back({std::move(tree), std::move(ancestors)});
    return number;
}

void MergeHistory::writeTree(const Tree &before, const Tree &after)
{
    // All that goes goes first: a file may take a folder's place.
    for (const auto &[path, file] : before)
    {
        if (after.count(path) == 0)
        {
            stream_ += "D " + quote(path) + '\n';
        }
    }
    for (const auto &[path, file] : after)
    {
        if (!areEqual(&file, find(before, path)))
        {
            stream_ +=
                "M " + file.mode + " inline " + quote(path) + '\n' + asFastImportData(file.content);
        }
    }
    stream_ += '\n';
}

void MergeHistory::addMerges(const MergeEdits::Kind &kind)
{
    const auto tip = random_.below(tipCount);
    const auto otherTip = (tip + 1 + random_.below(tipCount - 1)) % tipCount;
    const bool isTopic = random_.chance(55);
    Number ours = tips_[tip];
    Number theirs = isTopic ? ours : tips_[otherTip];
    if (random_.chance(40))
    {
        theirs = editSomewhere(theirs);
    }
    if (random_.chance(40))
    {
        ours = editSomewhere(ours);
    }
    Tree ourTree = commits_[ours].tree;
    Tree theirTree = commits_[theirs].tree;
    std::string subject = kind.name;
    if (!edits_.edit(kind, ourTree, theirTree))
    {
        subject = "nothing shared";
        edits_.editSomething(ourTree);
        edits_.editSomething(theirTree);
    }
    theirs = commit("theirs: " + subject, {theirs}, std::move(theirTree));
    // Now and then ours stays behind, so that the merge could have been a fast-forward.
    if (!isTopic || random_.chance(92))
    {
        ours = commit("ours: " + subject, {ours}, std::move(ourTree));
    }
    tips_[tip] = merge(subject, ours, theirs);
    if (isTopic)
    {
        return;
    }
    if (random_.chance(35))
    {
        tips_[otherTip] = merge("criss-cross: " + subject, theirs, ours);
    }
    else
    {
        tips_[otherTip] = random_.chance(60) ? tips_[tip] : theirs;
    }
}

MergeHistory::Number MergeHistory::merge(const std::string &subject, Number ours, Number theirs)
{
    const Tree &baseTree = commits_[findMergeBase(ours, theirs)].tree;
    const Tree &ourTree = commits_[ours].tree;
    const Tree &theirTree = commits_[theirs].tree;
    Tree result;
    for (const auto &path : pathsOf(ourTree, theirTree))
    {
        const auto *const base = find(baseTree, path);
        const auto *const our = find(ourTree, path);
        const auto *const their = find(theirTree, path);
        const bool isConflict = !areEqual(base, our) && !areEqual(base, their);
        const bool takesTheirs = isConflict ? random_.chance(50) : areEqual(base, our);
        const auto *const taken = takesTheirs ? their : our;
        if (taken != nullptr)
        {
            put(result, path, *taken);
        }
    }
    ++merges_;
    return commit(subject, {ours, theirs}, std::move(result));
}

MergeHistory::Number MergeHistory::findMergeBase(Number left, Number right) const
{
    for (Number number = left + 1; number-- > 0;)
    {
        const bool isOfLeft = number == left || commits_[left].ancestors[number];
        const bool isOfRight = number == right || (number < commits_[right].ancestors.size() &&
                                                   commits_[right].ancestors[number]);
        if (isOfLeft && isOfRight)
        {
            return number;
        }
    }
    throw std::logic_error("commits without a common ancestor");
}

MergeHistory::Number MergeHistory::editSomewhere(Number parent)
{
    Tree tree = commits_[parent].tree;
    edits_.editSomething(tree);
    return commit("work", {parent}, std::move(tree));
}

std::vector<MergeCommit> listMerges(const GitRepository &repository)
{
    std::istringstream lines(repository.git({"log", "--branches", "--merges", "--max-parents=2",
                                             "--topo-order", "--reverse", "--format=%P %s"}));
    std::vector<MergeCommit> merges;
    for (MergeCommit merge; lines >> merge.firstParent >> merge.secondParent >> std::ws;)
    {
        std::getline(lines, merge.subject);
        merges.push_back(merge);
    }
    return merges;
}

} // namespace vclink::test
