// SPDX-License-Identifier: MIT
#include "InterruptedMerge.hpp"

#include <set>
#include <utility>

#include <gtest/gtest.h>

#include "differential/Snapshot.hpp"
#include "support/adapterFor.hpp"
#include "support/strings.hpp"
#include "support/text.hpp"
#include "vclink/git/BranchManager.hpp"
#include "vclink/git/GitException.hpp"
#include "vclink/git/LibGit2Exception.hpp"

namespace vclink::test
{
namespace
{

using Lines = std::set<std::string>;

/// The paths in which two trees differ.
Lines changes(const GitRepository &repository, const std::string &from, const std::string &to)
{
    const auto paths = split(repository.git({"diff-tree", "-r", "--name-only", from, to}));
    return {paths.begin(), paths.end()};
}

/// The text between "working copy: " and the next remark is a line for the shell.
std::string wayOutOf(const std::string &refusal)
{
    const std::string introduction = "working copy: ";
    const auto begin = refusal.find(introduction);
    if (begin == std::string::npos)
        return {};
    return refusal.substr(begin + introduction.size(),
                          refusal.find("; if it is") - begin - introduction.size());
}

} // namespace

InterruptedMerge::InterruptedMerge(GitRepository repository)
    : repository_(std::move(repository)), own_("after " + repository_.git({"rev-parse", "HEAD"}))
{
}

bool InterruptedMerge::commit()
{
    writeOwnWork();
    try
    {
        adapterFor(repository_)->commit(upath(), u"as it stands");
    }
    catch (const git::LibGit2Exception &exception)
    {
        refusal_ = asUtf8(exception.getError().getMessage());
        expectOwnWork();
        return false;
    }
    expectOwnWork();
    expectBothSides();
    return true;
}

void InterruptedMerge::beginAgain()
{
    const std::string ours = repository_.line({"rev-parse", "HEAD"});
    followWayOut();
    expectOwnWork();
    EXPECT_EQ(repository_.line({"rev-parse", "HEAD"}), ours);
    // A merge refuses because of any edit.
    repository_.git({"checkout", "--quiet", "HEAD", "--", "file"});
    EXPECT_EQ(repository_.git({"status", "--porcelain"}), "?? notes\n");
    try
    {
        git::BranchManager::create(*adapterFor(repository_))->merge("topic");
    }
    catch (const git::GitException &exception)
    {
        ADD_FAILURE() << asUtf8(exception.GetUnicodeMessageTxt());
    }
    expectBothSides();
    EXPECT_EQ(repository_.read("notes"), own_ + "noted\n");
}

void InterruptedMerge::writeOwnWork()
{
    repository_.write("notes", own_ + "noted\n");
    repository_.write("file", own_ + "edited\n");
}

/// In the working copy, or in a commit or the stash.
void InterruptedMerge::expectOwnWork() const
{
    const auto &copy = repository_.path();
    EXPECT_EQ(lostOf({blobIdOf(own_ + "edited\n")}, takeSnapshot(copy, copy), copy), Lines());
    EXPECT_EQ(repository_.read("notes"), own_ + "noted\n");
}

void InterruptedMerge::followWayOut()
{
    const std::string wayOut = wayOutOf(refusal_);
    ASSERT_NE(wayOut, "") << refusal_;
    const auto result = Command({"/bin/sh", "-ec", wayOut}).in(repository_.path()).run();
    EXPECT_TRUE(result.succeeded()) << wayOut;
    EXPECT_EQ(result.errors, "") << wayOut;
}

/// Files that one side has changed are as on that side; files that both have changed are merged.
void InterruptedMerge::expectBothSides() const
{
    ASSERT_TRUE(repository_.tryGit({"rev-parse", "--verify", "HEAD^2"}).succeeded());
    const std::string base = repository_.line({"merge-base", "HEAD^1", "HEAD^2"});
    const Lines ours = changes(repository_, base, "HEAD^1");
    const Lines theirs = changes(repository_, base, "HEAD^2");
    const Lines unlikeOurs = changes(repository_, "HEAD^1", "HEAD");
    const Lines unlikeTheirs = changes(repository_, "HEAD^2", "HEAD");
    Lines missing;
    for (const auto &path : theirs)
        if (unlikeTheirs.count(path) != ours.count(path))
            missing.insert(path + " of theirs");
    for (const auto &path : ours)
        if (unlikeOurs.count(path) != theirs.count(path))
            missing.insert(path + " of ours");
    EXPECT_EQ(missing, Lines());
}

} // namespace vclink::test
