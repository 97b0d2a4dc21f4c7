// SPDX-License-Identifier: MIT
#include "util/repository/reflogAccess.hpp"

#include <functional>
#include <ostream>
#include <string>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "main/files/runScript.hpp"
#include "main/merge/MergeFixture.hpp"
#include "support/text.hpp"
#include "vclink/git/GitException.hpp"

namespace
{

using namespace vclink::test;

/// What a script puts in the place of the reflog $log, and why nothing can be appended to it. Empty
/// if libgit2 can go on.
struct Place
{
    const char *sentence;
    const char *script;
    const char *reason;
};

void PrintTo(const Place &place, std::ostream *stream)
{
    *stream << place.script;
}

/// "topic" and "main" have a commit each, and "ahead" one more than main. libgit2 finds out that a
/// reflog cannot be written to when the reference moves, after the files were written.
class PlaceOfReflog : public MergeFixture, public testing::WithParamInterface<Place>
{
  protected:
    PlaceOfReflog()
    {
        diverge(writes("ours", "x"), writes("file", "theirs\n"));
        makeBranch("ahead", writes("file", "ahead\n"));
    }

    /// Runs `action` and git, which may both move HEAD or its branch, or neither.
    void expectMoved(const std::string &reflog, const std::function<void()> &action,
                     const std::vector<std::string> &command) const
    {
        runScript(repository_, "log=.git/logs/" + reflog + "; " + GetParam().script);
        const GitRepository twin = makeTwin();
        const auto tree = workingTreeOf(repository_);
        const FileStamp index = indexStampOf(repository_);
        const std::string head = headOf(repository_);
        const std::string failure = failureIn(action);
        if (std::string(GetParam().reason).empty())
        {
            EXPECT_EQ(failure, "");
            twin.git(command);
            EXPECT_EQ(headOf(repository_), headOf(twin));
            EXPECT_EQ(workingTreeOf(repository_), workingTreeOf(twin));
            return;
        }
        // A fast-forward looks at the reflog of HEAD first.
        EXPECT_THAT(failure,
                    testing::AllOf(testing::HasSubstr("could not append to '" +
                                                      (repository_ / ".git/logs/").string()),
                                   testing::HasSubstr(std::string("': ") + GetParam().reason)));
        EXPECT_EQ(headOf(repository_), head);
        EXPECT_EQ(workingTreeOf(repository_), tree);
        EXPECT_EQ(indexStampOf(repository_), index);
    }

  private:
    static std::string failureIn(const std::function<void()> &action)
    {
        try
        {
            action();
            return {};
        }
        catch (const vclink::git::GitException &exception)
        {
            return asUtf8(exception.GetUnicodeMessageTxt());
        }
    }
    /// The branch, and the tree of its commit.
    static std::string headOf(const GitRepository &repository)
    {
        return repository.git({"symbolic-ref", "HEAD"}) +
               repository.git({"rev-parse", "HEAD^{tree}"});
    }
};

TEST_P(PlaceOfReflog, DecidesOverASwitch)
{
    expectMoved("HEAD", [this] { branches().switchBranch("topic"); },
                {"switch", "--quiet", "topic"});
}

TEST_P(PlaceOfReflog, DecidesOverAFastForward)
{
    expectMoved("refs/heads/main", [this] { merge("ahead"); }, {"merge", "--quiet", "ahead"});
}

TEST_P(PlaceOfReflog, DecidesOverAMerge)
{
    expectMoved("HEAD", [this] { merge("topic"); }, {"merge", "--quiet", "--no-edit", "topic"});
}

const Place places[] = {
    {"WithAFile", ":", ""},
    {"WithNothing", "rm -r .git/logs", ""},
    {"WithAnEmptyFolder", "rm $log; mkdir $log", ""},
    {"WithEmptyFolders", "rm $log; mkdir -p $log/one/two $log/three", ""},
    {"WithALinkToAFile", "mv $log ../log; ln -s $PWD/../log $log", ""},
    {"WithALinkToTheNullDevice", "rm $log; ln -s /dev/null $log", ""},
    {"BehindALinkToAFolder", "mv .git/logs ../logs; ln -s $PWD/../logs .git/logs", ""},
    {"IfReflogsAreOff",
     "rm $log; mkdir -p $log/left; : >$log/left/over; git config core.logAllRefUpdates false", ""},
    {"BelowAFile", "rm -r .git/logs; : >.git/logs", "Not a directory"},
    {"BelowALinkToNothing", "rm -r .git/logs; ln -s nowhere .git/logs",
     "No such file or directory"},
    {"WithALinkToNothing", "rm $log; ln -s nowhere/at/all $log", "No such file or directory"},
    {"WithAFullFolder", "rm $log; mkdir -p $log/left; : >$log/left/over", "Is a directory"},
    {"WithALinkToAFolder", "rm $log; mkdir ../empty; ln -s $PWD/../empty $log", "Is a directory"},
    {"WithAFifo", "rm $log; mkfifo $log", "No such device or address"},
    {"IfReflogsAreAlwaysOn",
     "rm -r .git/logs; : >.git/logs; git config core.logAllRefUpdates always", "Not a directory"},
};

INSTANTIATE_TEST_SUITE_P(It, PlaceOfReflog, testing::ValuesIn(places),
                         [](const auto &row) { return row.param.sentence; });

} // namespace
