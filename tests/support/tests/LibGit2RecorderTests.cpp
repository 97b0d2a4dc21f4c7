// SPDX-License-Identifier: MIT
#include "support/libgit2/LibGit2Recorder.hpp"

#include <string>
#include <thread>
#include <vector>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest-spi.h>
#include <gtest/gtest.h>

#include "support/GitFixture.hpp"
#include "support/LibGit2Session.hpp"

namespace
{

using testing::ElementsAre;
using testing::IsEmpty;
using namespace vclink::test;

static_assert(vclink::test::detail::nameOf<git_libgit2_init>() == "git_libgit2_init");
static_assert(vclink::test::detail::nameOf<git_checkout_tree>() == "git_checkout_tree");
static_assert(vclink::test::detail::nameOf<&git_repository_free>() == "git_repository_free");

/// Calls libgit2 as the library does, in a repository with one untracked file.
class LibGit2RecorderTest : public GitFixture
{
  protected:
    LibGit2RecorderTest()
    {
        repository_.write("file", "x");
    }

    int open(git_repository **out) const
    {
        return git_repository_open_ext(out, repository_.path().c_str(),
                                       GIT_REPOSITORY_OPEN_NO_SEARCH, nullptr);
    }
    /// Opens a repository and its index and releases both.
    std::vector<int> openAndRelease() const
    {
        git_repository *repository = nullptr;
        git_index *index = nullptr;
        std::vector<int> codes{open(&repository)};
        if (repository != nullptr)
            codes.push_back(git_repository_index(&index, repository));
        git_index_free(index);
        git_repository_free(repository);
        return codes;
    }
    /// Walks the status, asking for the state in the callback.
    int walk() const
    {
        git_repository *repository = nullptr;
        open(&repository);
        const int code = git_status_foreach_ext(
            repository, nullptr,
            [](const char *, unsigned, void *opened)
            { return git_repository_state(static_cast<git_repository *>(opened)); },
            repository);
        git_repository_free(repository);
        return code;
    }

    GitRepository repository_ = makeRepository();
    LibGit2Session session_{environment()};
};

TEST_F(LibGit2RecorderTest, NotesTheCallsInOrder)
{
    const LibGit2Recorder recorder;
    openAndRelease();
    EXPECT_THAT(recorder.names(), ElementsAre("git_repository_open_ext", "git_repository_index",
                                              "git_index_free", "git_repository_free"));
    EXPECT_EQ(recorder.steps(), recorder.names());
    EXPECT_THAT(recorder.openHandles(), IsEmpty());
    EXPECT_TRUE(recorder.calls().front().givesCode);
    EXPECT_FALSE(recorder.calls().back().givesCode);
}

TEST_F(LibGit2RecorderTest, CountsWhatOnlyReadsAsNoStepAndTheStarts)
{
    LibGit2Recorder recorder;
    git_repository *repository = nullptr;
    open(&repository);
    git_repository_workdir(repository);
    recorder.note("an event");
    EXPECT_THAT(recorder.names(),
                ElementsAre("git_repository_open_ext", "git_repository_workdir", "an event"));
    EXPECT_THAT(recorder.steps(), ElementsAre("git_repository_open_ext", "an event"));
    git_repository_free(repository);
    recorder.clear();
    EXPECT_THAT(recorder.calls(), IsEmpty());
    git_libgit2_init();
    EXPECT_EQ(recorder.starts(), 1);
    git_libgit2_shutdown();
    EXPECT_EQ(recorder.starts(), 0);
}

TEST_F(LibGit2RecorderTest, TellsWhatIsNotReleasedAndWhatNobodyGaveOut)
{
    git_repository *repository = nullptr;
    open(&repository);
    const LibGit2Recorder recorder;
    git_index *index = nullptr;
    git_repository_index(&index, repository);
    EXPECT_THAT(recorder.openHandles(), ElementsAre("git_repository_index"));
    git_index_free(index);
    EXPECT_THAT(recorder.openHandles(), IsEmpty());
    git_repository_free(repository);
    EXPECT_EQ(recorder.calls().back().handle, repository);
    EXPECT_THAT(recorder.openHandles(), ElementsAre("foreign: git_repository_free"));
}

TEST_F(LibGit2RecorderTest, LetsACallFailInsteadOfReachingLibGit2OrAfterItsWork)
{
    LibGit2Recorder recorder;
    recorder.fail({{"git_repository_index", GIT_ELOCKED}});
    EXPECT_THAT(openAndRelease(), ElementsAre(0, GIT_ELOCKED));
    ASSERT_NE(git_error_last(), nullptr);
    EXPECT_EQ(git_error_last()->klass, GIT_ERROR_OS);
    EXPECT_STREQ(git_error_last()->message, injectedText);
    recorder.fail({});
    EXPECT_THAT(openAndRelease(), ElementsAre(0, 0));
    recorder.fail({{"git_repository_open_ext", GIT_ELOCKED, 0, When::After}});
    EXPECT_THAT(openAndRelease(), ElementsAre(GIT_ELOCKED, 0)) << "the repository is open";
    EXPECT_THAT(recorder.openHandles(), IsEmpty());
}

TEST_F(LibGit2RecorderTest, LetsOneOfSeveralCallsFail)
{
    LibGit2Recorder recorder;
    recorder.fail({{"git_repository_open_ext", -9, 2}, {"", -8, 5}});
    EXPECT_THAT(openAndRelease(), ElementsAre(0, 0));
    EXPECT_THAT(openAndRelease(), ElementsAre(-9));
    EXPECT_THAT(openAndRelease(), ElementsAre(0, -8));
    recorder.clear();
    EXPECT_THAT(openAndRelease(), ElementsAre(0, 0));
    EXPECT_THAT(openAndRelease(), ElementsAre(-9)) << "counted from the last clear()";
}

TEST_F(LibGit2RecorderTest, ShowsTheArgumentsBeforeTheCallFails)
{
    LibGit2Recorder recorder;
    std::vector<std::string> seen;
    recorder.onCall = [&](const std::string &name) { seen.push_back(name); };
    recorder.on<git_repository_open_ext>(
        [&](git_repository **, const char *path, unsigned, const char *)
        {
            seen.emplace_back(path);
            // A hook's calls are its own.
            git_libgit2_features();
            recorder.fail({{"git_repository_open_ext", -9}});
        });
    EXPECT_THAT(openAndRelease(), ElementsAre(-9));
    EXPECT_THAT(seen, ElementsAre("git_repository_open_ext", repository_.path().string(),
                                  "git_index_free", "git_repository_free"));
    EXPECT_THAT(recorder.names(),
                ElementsAre("git_repository_open_ext", "git_index_free", "git_repository_free"));
    recorder.on<git_repository_open_ext>(nullptr);
    recorder.fail({});
    EXPECT_THAT(openAndRelease(), ElementsAre(0, 0));
    EXPECT_EQ(seen.size(), 8U) << "only the names any more";
}

TEST_F(LibGit2RecorderTest, LetsATestAnswer)
{
    LibGit2Recorder recorder;
    recorder.answer<git_libgit2_features>([](auto...) { return 42; });
    EXPECT_EQ(git_libgit2_features(), 42);
    recorder.answer<git_libgit2_features>([](auto real) { return ~real(); });
    const int inverted = git_libgit2_features();
    recorder.answer<git_libgit2_features>(nullptr);
    EXPECT_EQ(git_libgit2_features(), ~inverted);
    EXPECT_THAT(recorder.names(), ElementsAre("git_libgit2_features", "git_libgit2_features",
                                              "git_libgit2_features"));
    recorder.answer<git_repository_workdir>([](auto...) { return "/nowhere"; });
    EXPECT_STREQ(git_repository_workdir(nullptr), "/nowhere");
}

TEST_F(LibGit2RecorderTest, LeavesTheCallsOfCallbacksAloneUnlessItIsAskedToFollowThem)
{
    {
        LibGit2Recorder recorder;
        recorder.fail({{"git_repository_state", -9}});
        EXPECT_EQ(walk(), 0);
        EXPECT_THAT(recorder.names(), ElementsAre("git_repository_open_ext",
                                                  "git_status_foreach_ext", "git_repository_free"));
    }
    LibGit2Recorder recorder(LibGit2Recorder::InCallbacks::Followed);
    EXPECT_EQ(walk(), 0);
    EXPECT_THAT(recorder.names(), ElementsAre("git_repository_open_ext", "git_status_foreach_ext",
                                              "git_repository_state", "git_repository_free"));
    recorder.fail({{"git_repository_state", -9}});
    EXPECT_EQ(walk(), -9);
}

TEST_F(LibGit2RecorderTest, FollowsItsOwnThread)
{
    LibGit2Recorder recorder;
    recorder.fail({{"git_repository_open_ext", -9}});
    std::vector<int> codes;
    std::thread([&] { codes = openAndRelease(); }).join();
    EXPECT_THAT(codes, ElementsAre(0, 0));
    EXPECT_THAT(recorder.calls(), IsEmpty());
}

TEST_F(LibGit2RecorderTest, PutsEverythingBackAtItsEnd)
{
    {
        LibGit2Recorder recorder;
        recorder.fail({{"git_repository_open_ext", -9}});
        recorder.answer<git_repository_index>([](auto...) { return -9; });
        EXPECT_THAT(openAndRelease(), ElementsAre(-9));
    }
    EXPECT_THAT(openAndRelease(), ElementsAre(0, 0));
    const LibGit2Recorder next;
    EXPECT_THAT(openAndRelease(), ElementsAre(0, 0));
}

TEST_F(LibGit2RecorderTest, RefusesWhatTheLibraryDoesNotCallAndAnotherRecorder)
{
    LibGit2Recorder recorder;
    EXPECT_NONFATAL_FAILURE(LibGit2Recorder(), "another recorder is alive");
    EXPECT_NONFATAL_FAILURE(recorder.fail({{"git_index_wrote", -9}}),
                            "the library does not call git_index_wrote");
    EXPECT_NONFATAL_FAILURE(recorder.on<git_repository_is_bare>([](auto...) {}),
                            "the library does not call git_repository_is_bare");
    EXPECT_NONFATAL_FAILURE(recorder.answer<git_repository_is_bare>([](auto...) { return 0; }),
                            "the library does not call git_repository_is_bare");
}

} // namespace
