// SPDX-License-Identifier: MIT
#include <csignal>
#include <filesystem>
#include <functional>
#include <string>
#include <utility>
#include <vector>

#include <boost/filesystem/exception.hpp>
#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/resource.h>

#include "StagingFixture.hpp"
#include "error/errorUtil/callbackException.hpp"

namespace
{

namespace fs = std::filesystem;
using shared_vclink::git::NoFilesToRemove;
using vclink::git::TagException;
using namespace vclink::test;

/// What a failure of libgit2 leaves behind: nothing, here with a repository that holds changes of
/// all kinds.
class StagingFailure : public StagingFixture
{
  protected:
    StagingFailure()
    {
        beginMerge({"conflicted"});
        repository_.write("file", "edited\n");
        repository_.write("staged", "x");
        repository_.add({"staged"});
        repository_.write("new", "x");
    }

    /// Each of the operations with a file that it would take.
    std::vector<std::pair<std::string, std::function<void()>>> operations() const
    {
        return {{"addFiles", [this] { add({"new"}); }},
                {"removeFiles", [this] { remove({"file"}); }},
                {"markResolved", [this] { markResolved("conflicted"); }},
                {"markResolved of an absent file", [this] { markResolved("missing"); }},
                {"revertFiles", [this] {
                     revert({"file", "other"});
                 }}};
    }

    std::string inGit(const std::string &name) const
    {
        return repository_ / (".git/" + name);
    }
};

TEST_F(StagingFailure, OfALockedIndexChangesNothingAndIsNoneWhereNothingIsWritten)
{
    repository_.write(".git/index.lock", "another process");
    const NothingChanges nothing(repository_);
    for (const auto &[name, operation] : operations())
    {
        SCOPED_TRACE(name);
        EXPECT_EQ(failureOf(operation),
                  (Failure{GIT_ELOCKED, GIT_ERROR_INDEX,
                           "the index is locked by '" + inGit("index.lock") +
                               "'; this might be due to a concurrent or crashed process"}));
        EXPECT_EQ(vclink::git::pendingCallbackException(), nullptr);
    }
    EXPECT_EQ(repository_.read(".git/index.lock"), "another process");
    EXPECT_NO_THROW(add({}));
    EXPECT_NO_THROW(add({"missing"}));
    EXPECT_THROW(remove({"missing"}), TagException<NoFilesToRemove>);
}

TEST_F(StagingFailure, OfAPathThatTheIndexDoesNotTakeChangesNothing)
{
    auto nested = GitRepository::init(repository_ / "nested");
    nested.write("inside", "x");
    nested.commitAll("first");
    GitRepository::init(repository_ / "unborn").write("inside", "x");
    repository_.write("git~1", "x");
    const NothingChanges nothing(repository_);
    const std::vector<std::pair<std::vector<std::string>, std::string>> lists{
        {{"nested"}, "nested/"},
        {{"new", "nested"}, "nested/"},
        {{"unborn", "new"}, "unborn/"},
        {{"new", "git~1"}, "git~1"}};
    for (const auto &[names, path] : lists)
        EXPECT_EQ(failureOf([&, &list = names] { add(list); }),
                  (Failure{GIT_ERROR, GIT_ERROR_INDEX, "invalid path: '" + path + "'"}));
    EXPECT_EQ(failureOf([this] { markResolved("nested"); }).code, GIT_ERROR);
}

/// What was put into the index before the failure is not there for the next operation either.
TEST_F(StagingFailure, OfLineEndsThatWouldBeLostChangesNothing)
{
    repository_.git({"config", "core.safecrlf", "true"});
    repository_.git({"config", "core.autocrlf", "true"});
    repository_.write("zz", "one\r\ntwo\n");
    const auto adapter = makeAdapter(repository_.path());
    {
        const NothingChanges nothing(repository_);
        for (const auto &names :
             {std::vector<std::string>{"zz"}, std::vector<std::string>{"new", "zz"}})
            EXPECT_EQ(
                failureOf([&] { adapter->addFiles(files(names)); }),
                (Failure{GIT_ERROR, GIT_ERROR_FILTER, "LF would be replaced by CRLF in 'zz'"}));
        EXPECT_EQ(failureOf([this] { markResolved("zz"); }).code, GIT_ERROR);
    }
    adapter->removeFiles(files({"file"}));
    EXPECT_EQ(states(repository_, {"file", "new", "zz"}),
              (States{{"file", "Deleted"}, {"new", "Unversioned"}, {"zz", "Unversioned"}}));
}

TEST_F(StagingFailure, OfAFileThatCannotBeReadChangesNothing)
{
    repository_.write("secret", "x");
    repository_.setMode("secret", 0000);
    giveAway();
    const NothingChanges nothing(repository_);
    EXPECT_EQ(unprivilegedFailureOf(
                  [this] {
                      add({"new", "secret"});
                  }),
              printed({GIT_ERROR, GIT_ERROR_OS,
                       "failed open - '" + (repository_ / "secret").string() +
                           "' is locked: Permission denied"}));
}

TEST_F(StagingFailure, OfAFolderOfGitThatCannotBeWrittenChangesNothing)
{
    giveAway();
    repository_.setMode(".git", 0555);
    {
        const NothingChanges nothing(repository_);
        for (const auto &[name, operation] : operations())
        {
            SCOPED_TRACE(name);
            EXPECT_EQ(unprivilegedFailureOf(operation),
                      printed({GIT_ERROR, GIT_ERROR_OS,
                               "failed to create locked file '" + inGit("index.lock") +
                                   "': Permission denied"}));
        }
    }
    repository_.setMode(".git", 0755);
}

TEST_F(StagingFailure, OfObjectsThatCannotBeWrittenChangesNothing)
{
    giveAway();
    for (const auto &entry : fs::recursive_directory_iterator(repository_ / ".git/objects"))
    {
        if (entry.is_directory())
            fs::permissions(entry.path(), fs::perms(0555));
    }
    repository_.setMode(".git/objects", 0555);
    repository_.write("new", "a content that is not there yet");
    {
        const NothingChanges nothing(repository_);
        EXPECT_THAT(unprivilegedFailureOf([this] { add({"new"}); }),
                    testing::StartsWith("code -1, class 2: failed to create temporary file '" +
                                        inGit("objects/")));
    }
    repository_.setMode(".git/objects", 0755);
}

/// As on a full disk.
TEST_F(StagingFailure, OfAnIndexThatCannotBeWrittenToItsEndChangesNothing)
{
    for (int i = 0; i < 100; ++i)
        repository_.write("many/" + std::to_string(i), "x");
    repository_.add({"many"});
    giveAway();
    const NothingChanges nothing(repository_);
    const auto withLittleSpace = [](const std::function<void()> &action)
    {
        std::signal(SIGXFSZ, SIG_IGN);
        const rlimit limit{4'096, 4'096};
        ::setrlimit(RLIMIT_FSIZE, &limit);
        action();
    };
    EXPECT_EQ(
        unprivilegedFailureOf([&] { withLittleSpace([this] { remove({"file"}); }); }),
        printed({GIT_ERROR, GIT_ERROR_OS,
                 "could not copy the index to '" + inGit("index.vclink") + "': File too large"}));
}

TEST_F(StagingFailure, OfARootThatCannotBeOpenedIsRaised)
{
    const auto missing = makeAdapter(folder() / "missing");
    const upath file = asPath(folder() / "missing/file");
    const Failure failure{GIT_ENOTFOUND, GIT_ERROR_OS,
                          "failed to resolve path '" + (folder() / "missing").string() +
                              "': No such file or directory"};
    EXPECT_EQ(failureOf([&] { missing->addFiles({file}); }), failure);
    EXPECT_EQ(failureOf([&] { missing->removeFiles({file}); }), failure);
    EXPECT_EQ(failureOf([&] { missing->markResolved(file); }), failure);
    EXPECT_EQ(failureOf([&] { missing->revertFiles({file}); }), failure);
    EXPECT_EQ(failureOf([&] { missing->markResolved(asPath(repository_ / "file")); }), failure);
    EXPECT_FALSE(fs::exists(folder() / "missing"));
}

TEST_F(StagingFailure, OfABareRepositoryChangesNothing)
{
    const std::string bare = folder() / "bare";
    repository_.git({"clone", "--quiet", "--bare", repository_.path().string(), bare});
    const auto adapter = makeAdapter(bare);
    const std::vector<upath> file{asPath(bare + "/file")};
    EXPECT_NO_THROW(adapter->addFiles({asPath(bare + "/config")}));
    EXPECT_THROW(adapter->removeFiles(file), TagException<NoFilesToRemove>);
    EXPECT_EQ(failureOf([&] { adapter->markResolved(asPath(bare + "/config")); }).code,
              GIT_EBAREREPO);
    EXPECT_FALSE(fs::exists(bare + "/index"));
    EXPECT_EQ(
        failureOf([&] { adapter->revertFiles(file); }),
        (Failure{GIT_EBAREREPO, GIT_ERROR_REPOSITORY,
                 "cannot checkout. This operation is not allowed against bare repositories."}));
}

TEST_F(StagingFailure, OfALoopOfLinksChangesNothing)
{
    repository_.symlink("loop", "loop");
    const NothingChanges nothing(repository_);
    using boost::filesystem::filesystem_error;
    EXPECT_THROW(add({"new", "loop"}), filesystem_error);
    EXPECT_THROW(remove({"file", "loop"}), filesystem_error);
    EXPECT_THROW(markResolved("loop"), filesystem_error);
    EXPECT_THROW(revert({"file", "loop"}), filesystem_error);
}

TEST_F(StagingFailure, OfABrokenConfigurationIsRaisedAndChangesNothing)
{
    const std::string config = repository_.read(".git/config");
    const auto index = indexStampOf(repository_);
    repository_.write(".git/config", "[core\n");
    for (const auto &[name, operation] : operations())
    {
        SCOPED_TRACE(name);
        EXPECT_EQ(failureOf(operation),
                  (Failure{GIT_ERROR, GIT_ERROR_CONFIG,
                           "failed to parse config file: missing ']' in section header (in " +
                               inGit("config") + ":1)"}));
    }
    repository_.write(".git/config", config);
    EXPECT_EQ(indexStampOf(repository_), index);
}

/// The state query gives no states then, so that there is nothing to do for it.
TEST_F(StagingFailure, OfABrokenIndexLeavesItAsItIs)
{
    repository_.write(".git/index", notAnIndex);
    const auto index = stampOf(repository_ / ".git/index");
    EXPECT_NO_THROW(add({"new"}));
    EXPECT_THROW(remove({"file"}), TagException<NoFilesToRemove>);
    EXPECT_EQ(failureOf([this] { markResolved("conflicted"); }),
              (Failure{GIT_ERROR, GIT_ERROR_INDEX,
                       "invalid data in index - incorrect header signature"}));
    EXPECT_EQ(failureOf([this] { markResolved("missing"); }).code, GIT_ERROR);
    EXPECT_EQ(stampOf(repository_ / ".git/index"), index);
}

TEST_F(StagingFailure, OfAnIndexThatLibGit2CannotReadLeavesItAsItIs)
{
    repository_.git({"update-index", "--split-index"});
    const NothingChanges nothing(repository_);
    EXPECT_NO_THROW(add({"new"}));
    EXPECT_THROW(remove({"file"}), TagException<NoFilesToRemove>);
    EXPECT_EQ(failureOf([this] { markResolved("file"); }),
              (Failure{GIT_ERROR, GIT_ERROR_INDEX, "unsupported mandatory extension: 'link'"}));
}

} // namespace
