// SPDX-License-Identifier: MIT
#include "MergeFixture.hpp"

#include <algorithm>
#include <ostream>
#include <tuple>
#include <typeinfo>

#include <boost/variant/get.hpp>
#include <gtest/gtest.h>

#include "support/readFile.hpp"
#include "support/text.hpp"
#include "vclink/git/GitException.hpp"
#include "vclink/git/messageIdentifiers.hpp"

namespace vclink::test
{
namespace
{

auto members(const MergeOutcome &outcome)
{
    return std::tie(outcome.parents, outcome.tree, outcome.mergeHead, outcome.index,
                    outcome.workingTree);
}

/// Removes what follows seven of these characters and a blank, up to the end of the line.
void cutLabels(std::string &text, const std::string &marker)
{
    for (auto at = text.find(marker); at != std::string::npos; at = text.find(marker, at + 1))
    {
        const auto begin = at + marker.size();
        const auto end = std::min(text.find('\n', begin), text.size());
        text.erase(begin, end - begin);
    }
}

RepositoryState::Entries withoutLabels(RepositoryState::Entries entries)
{
    for (auto &[name, content] : entries)
    {
        cutLabels(content, "<<<<<<< ");
        cutLabels(content, "||||||| ");
        cutLabels(content, ">>>>>>> ");
    }
    return entries;
}

void print(std::ostream &stream, const RepositoryState::Entries &entries)
{
    for (const auto &[name, content] : entries)
        stream << "  " << testing::PrintToString(name) << ": " << testing::PrintToString(content)
               << '\n';
}

} // namespace

MergeOutcome outcomeIn(const GitRepository &repository)
{
    MergeOutcome outcome;
    const std::string commit = repository.tryGit({"log", "-1", "--format=%T %P"}).output;
    const auto blank = std::min(commit.find(' '), commit.size());
    outcome.tree = commit.substr(0, blank);
    outcome.parents = commit.substr(blank);
    outcome.mergeHead = readFile(repository.gitFolder() / "MERGE_HEAD");
    outcome.index = indexOf(repository);
    outcome.workingTree = withoutLabels(workingTreeOf(repository));
    return outcome;
}

bool operator==(const MergeOutcome &left, const MergeOutcome &right)
{
    return members(left) == members(right);
}

std::ostream &operator<<(std::ostream &stream, const MergeOutcome &outcome)
{
    stream << "tree " << outcome.tree << ", parents" << outcome.parents << "merge head "
           << outcome.mergeHead << "\nindex:\n";
    print(stream, outcome.index);
    stream << "working tree:\n";
    print(stream, outcome.workingTree);
    return stream;
}

MergeFixture::MergeFixture()
{
    repository_.write("file", "1\n2\n3\n4\n5\n6\n7\n8\n9\n");
    repository_.write("other", "other\n");
    repository_.commitAll("first");
}

std::string MergeFixture::failureOfMerge(const std::string &name) const
{
    try
    {
        merge(name);
        ADD_FAILURE() << "no exception";
    }
    catch (const git::GitException &exception)
    {
        const vclink::exception::SourceControlException &base = exception;
        EXPECT_EQ(typeid(base), typeid(git::GitException));
        EXPECT_EQ(exception.GetID(), "shared_vclink:git:MergeFailed");
        const auto &arguments = exception.GetBaseMsgIDObj().getArguments();
        EXPECT_EQ(arguments.size(), 1U);
        EXPECT_EQ(boost::get<std::string>(arguments.at(0)), name);
        const std::string text = asUtf8(exception.GetUnicodeMessageTxt());
        const std::string first = textOf(shared_vclink::git::MergeFailed(name)) + '\n';
        EXPECT_EQ(text.substr(0, first.size()), first);
        return text.substr(std::min(first.size(), text.size()));
    }
    return {};
}

void MergeFixture::expectConflicts(const std::string &name) const
{
    EXPECT_EQ(failureOfMerge(name), textOf(shared_vclink::git::HasConflicts()));
    EXPECT_EQ(branches().getRepositoryState(), "Conflicts");
}

void MergeFixture::diverge(const Change &ours, const Change &theirs)
{
    makeBranch("topic", theirs);
    repository_.commitAll(ours, "on main");
}

void MergeFixture::makeAhead()
{
    makeBranch("topic", writes("new", "x"));
}

void MergeFixture::makeDiverged()
{
    diverge(writes("ours", "x"), writes("theirs", "x"));
}

void MergeFixture::prefer(const std::string &value) const
{
    repository_.git({"config", "merge.ff", value});
}

void MergeFixture::crissCross(const Change &ours, const Change &theirs)
{
    const std::string first = idOf("main");
    repository_.git({"merge", "--quiet", "--no-edit", "topic"});
    repository_.commitAll(ours, "on main again");
    repository_.git({"checkout", "--quiet", "topic"});
    repository_.git({"merge", "--quiet", "--no-edit", first});
    repository_.commitAll(theirs, "on topic again");
    repository_.git({"checkout", "--quiet", "main"});
    ASSERT_EQ(split(repository_.git({"merge-base", "--all", "main", "topic"})).size(), 2U);
}

GitRepository MergeFixture::addModule()
{
    auto inner = makeRepository("inner");
    inner.commitAll("inner 1");
    repository_.git({"submodule", "--quiet", "add", inner.path().string(), "module"});
    repository_.commitAll("module");
    return inner;
}

GitRepository MergeFixture::makeTwin() const
{
    const GitRepository twin(folder() / "twin");
    std::filesystem::remove_all(twin.path());
    const auto copied =
        Command({"cp", "-a", repository_.path().string(), twin.path().string()}).run();
    EXPECT_TRUE(copied.succeeded()) << copied.errors;
    return twin;
}

MergeOutcome MergeFixture::outcomeByGit(const std::string &name) const
{
    const GitRepository twin = makeTwin();
    twin.tryGit({"merge", "--quiet", "--no-edit", name});
    return outcomeIn(twin);
}

MergeOutcome MergeFixture::outcomeByLibrary(const std::string &name) const
{
    try
    {
        merge(name);
    }
    catch (const git::GitException &exception)
    {
        const std::string text = asUtf8(exception.GetUnicodeMessageTxt());
        const std::string conflicts = textOf(shared_vclink::git::HasConflicts());
        EXPECT_NE(text.find(conflicts), std::string::npos) << text;
    }
    return outcomeIn(repository_);
}

void MergeFixture::expectAsGit(const std::string &name) const
{
    const MergeOutcome expected = outcomeByGit(name);
    EXPECT_EQ(outcomeByLibrary(name), expected);
}

void MergeFixture::expectCleanAsGit() const
{
    const std::string ours = idOf("HEAD");
    expectAsGit();
    EXPECT_EQ(parents(), (std::vector<std::string>{ours, idOf("topic")}));
    EXPECT_EQ(status(), std::vector<std::string>());
    EXPECT_EQ(branches().getRepositoryState(), "Normal");
    EXPECT_EQ(stateOf(repository_).underWay.count("MERGE_HEAD"), 0U);
}

void MergeFixture::expectConflictsAsGit(const std::vector<std::string> &expected) const
{
    const std::string ours = idOf("HEAD");
    expectAsGit();
    EXPECT_EQ(conflicts(), expected);
    EXPECT_EQ(idOf("HEAD"), ours);
    EXPECT_EQ(branches().getRepositoryState(), "Conflicts");
}

std::vector<std::string> MergeFixture::conflicts() const
{
    std::vector<std::string> lines =
        split(repository_.git({"ls-files", "--unmerged", "--format=%(stage) %(path)"}));
    return lines;
}

std::string MergeFixture::message() const
{
    const std::string commit = repository_.git({"cat-file", "commit", "HEAD"});
    return commit.substr(commit.find("\n\n") + 2);
}

std::vector<std::string> MergeFixture::parents() const
{
    return split(repository_.git({"rev-parse", "HEAD^@"}));
}

} // namespace vclink::test
