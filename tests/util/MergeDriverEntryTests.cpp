// SPDX-License-Identifier: MIT
// The driver's entry, called as libgit2 calls it, with libgit2's answers made by the test.
#include <csignal>
#include <cstdint>
#include <exception>
#include <filesystem>
#include <optional>
#include <stdexcept>
#include <string>
#include <system_error>
#include <utility>
#include <vector>

#include <git2.h>
#include <git2/sys/merge.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "error/errorUtil/GitResult.hpp"
#include "error/errorUtil/callbackException.hpp"
#include "support/Failure.hpp"
#include "support/GitFixture.hpp"
#include "support/LibGit2Session.hpp"
#include "support/LogCapture.hpp"
#include "support/NothingLeft.hpp"
#include "support/Scripts.hpp"
#include "support/libgit2/LibGit2Recorder.hpp"
#include "support/readFile.hpp"
#include "util/GitMergeDriverLookup.hpp"
#include "vclink/git/LibGit2Guard.hpp"

namespace
{

namespace git = vclink::git;
using testing::Contains;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::Not;
using namespace vclink::test;

/// The content of the source of a merge.
struct Source
{
    const git_index_entry *ancestor = nullptr;
    const git_index_entry *ours = nullptr;
    const git_index_entry *theirs = nullptr;
    git_repository *repository = nullptr;
    git_merge_file_options options = {};
};

/// What the driver gives back.
struct Answer
{
    int code = 0;
    /// empty unless the driver has set it
    std::optional<std::string> path;
    std::optional<std::uint32_t> mode;
    std::string content;
    /// what the driver has left in the slot, taken out of it
    std::exception_ptr exception;
};

class MergeDriverEntry : public GitFixture
{
  protected:
    MergeDriverEntry()
    {
        opened_ =
            git::acquire<git_repository>(git_repository_open, repository_.path().c_str()).value();
        source_ = {makeEntry(ancestor_, "base\n"), makeEntry(ours_, "ours\n"),
                   makeEntry(theirs_, "theirs\n"), opened_.get()};
        answerForTheSource();
    }

    /// The driver's answer for the driver "tool".
    Answer apply()
    {
        const NothingLeft check(environment().temporary());
        static const char untouched[] = "untouched";
        const char *path = untouched;
        std::uint32_t mode = 7;
        git_buf content = GIT_BUF_INIT;
        Answer answer;
        calls_.clear();
        answer.code = git::wildcardApplyEntry(nullptr, &path, &mode, &content, "tool", nullptr);
        names_ = calls_.names();
        steps_ = calls_.steps();
        if (path != untouched)
            answer.path = path;
        if (mode != 7)
            answer.mode = mode;
        if (content.size != 0)
            answer.content.assign(content.ptr, content.size);
        git_buf_dispose(&content);
        std::swap(answer.exception, git::pendingCallbackException());
        return answer;
    }
    void defineScript(const std::string &script)
    {
        repository_.git(
            {"config", "merge.tool.driver", scripts_.shell(script) + " %O %A %B %L %P"});
    }
    git_index_entry ancestor_ = {};
    git_index_entry ours_ = {};
    git_index_entry theirs_ = {};
    Scripts scripts_{folder() / "scripts"};
    GitRepository repository_ = makeRepository();
    LibGit2Session session_{environment()};
    Source source_;
    git::OwnedHandle<git_repository> opened_;
    LibGit2Recorder calls_;
    /// The driver's calls in the last apply(), and those of them that are steps.
    std::vector<std::string> names_;
    std::vector<std::string> steps_;

  private:
    void answerForTheSource()
    {
        calls_.answer<git_merge_driver_source_ancestor>([this](auto...)
                                                        { return source_.ancestor; });
        calls_.answer<git_merge_driver_source_ours>([this](auto...) { return source_.ours; });
        calls_.answer<git_merge_driver_source_theirs>([this](auto...) { return source_.theirs; });
        calls_.answer<git_merge_driver_source_file_options>([this](auto...)
                                                            { return &source_.options; });
        calls_.answer<git_merge_driver_source_repo>([this](auto...) { return source_.repository; });
    }
    const git_index_entry *makeEntry(git_index_entry &entry, const std::string &content)
    {
        repository_.write("side", content);
        const std::string id = repository_.line({"hash-object", "-w", "side"});
        git_oid_fromstr(&entry.id, id.c_str());
        entry.mode = GIT_FILEMODE_BLOB;
        entry.path = "file";
        return &entry;
    }
};

TEST_F(MergeDriverEntry, ReportsEachMissingSideAndReadsNothing)
{
    defineScript("exit 0");
    for (unsigned missing = 1; missing < 8; ++missing)
    {
        SCOPED_TRACE(missing);
        source_.ancestor = (missing & 1) != 0 ? nullptr : &ancestor_;
        source_.ours = (missing & 2) != 0 ? nullptr : &ours_;
        source_.theirs = (missing & 4) != 0 ? nullptr : &theirs_;
        std::vector<std::string> expected;
        if ((missing & 1) != 0)
            expected.emplace_back("base is nullptr");
        if ((missing & 2) != 0)
            expected.emplace_back("mine is nullptr");
        if ((missing & 4) != 0)
            expected.emplace_back("theirs is nullptr");
        const LogCapture log(0x08);
        const Answer answer = apply();
        EXPECT_EQ(answer.code, GIT_EMERGECONFLICT);
        EXPECT_EQ(log.messages(), expected);
        EXPECT_THAT(names_,
                    ElementsAre("git_merge_driver_source_ancestor", "git_merge_driver_source_ours",
                                "git_merge_driver_source_theirs",
                                "git_merge_driver_source_file_options"));
        EXPECT_FALSE(answer.path);
        EXPECT_FALSE(answer.mode);
    }
}

TEST_F(MergeDriverEntry, CallsLibGit2InThisOrder)
{
    defineScript("echo merged >\"$2\"");
    std::vector<bool> filesAtRelease;
    calls_.onCall = [&](const std::string &name)
    {
        if (name == "git_config_entry_free")
            filesAtRelease.push_back(std::filesystem::is_empty(environment().temporary()));
    };
    const Answer answer = apply();
    EXPECT_EQ(answer.code, 0);
    ASSERT_GE(names_.size(), 7U);
    names_.resize(7);
    EXPECT_THAT(names_,
                ElementsAre("git_merge_driver_source_ancestor", "git_merge_driver_source_ours",
                            "git_merge_driver_source_theirs",
                            "git_merge_driver_source_file_options", "git_merge_driver_source_repo",
                            "git_error_clear", "git_repository_config_snapshot"));
    EXPECT_THAT(steps_, ElementsAre("git_repository_config_snapshot", "git_config_get_entry",
                                    "git_repository_odb", "git_odb_read", "git_odb_object_free",
                                    "git_odb_free", "git_repository_odb", "git_odb_read",
                                    "git_odb_object_free", "git_odb_free", "git_repository_odb",
                                    "git_odb_read", "git_odb_object_free", "git_odb_free",
                                    "git_buf_set", "git_config_entry_free", "git_config_free"));
    // The temporary files go before the configuration.
    EXPECT_THAT(filesAtRelease, ElementsAre(true));
    EXPECT_EQ(answer.path, "file");
    EXPECT_EQ(answer.mode, 0100644U);
    EXPECT_EQ(answer.content, "merged\n");
}

TEST_F(MergeDriverEntry, ReadsNoResultOfARefusal)
{
    defineScript("echo merged >\"$2\"; exit 1");
    const Answer answer = apply();
    EXPECT_EQ(answer.code, GIT_EMERGECONFLICT);
    EXPECT_THAT(names_, Not(Contains("git_buf_set")));
    EXPECT_FALSE(answer.path);
    EXPECT_FALSE(answer.mode);
    EXPECT_EQ(answer.content, "");
}

TEST_F(MergeDriverEntry, PassesTheFileOnWhateverKeepsTheKeyFromBeingRead)
{
    defineScript("exit 0");
    for (const int code : {-3, -1, -12, 1})
    {
        calls_.fail({{"git_config_get_entry", code}});
        const LogCapture log(0x200);
        const Answer answer = apply();
        EXPECT_EQ(answer.code, GIT_PASSTHROUGH);
        EXPECT_THAT(log.messages(), ElementsAre("Merge driver merge.tool.driver not found"));
        EXPECT_EQ(answer.exception, nullptr);
        EXPECT_EQ(steps_.back(), "git_config_free");
        EXPECT_THAT(names_, Not(Contains("git_repository_odb")));
    }
}

TEST_F(MergeDriverEntry, LeavesPathAndModeWhenTheResultCannotBeHandedOver)
{
    defineScript("exit 0");
    calls_.fail({{"git_buf_set", GIT_ERROR}});
    const Answer answer = apply();
    EXPECT_EQ(answer.code, GIT_EUSER);
    EXPECT_EQ(failureOf([&] { std::rethrow_exception(answer.exception); }).code, GIT_ERROR);
    EXPECT_FALSE(answer.path);
    EXPECT_FALSE(answer.mode);
    EXPECT_EQ(steps_.back(), "git_config_free");
}

TEST_F(MergeDriverEntry, WritesTheMarkerSizeInDecimal)
{
    const std::string out = folder() / "size";
    defineScript("echo $4 >" + out);
    for (const std::uint16_t size : std::vector<std::uint16_t>{0, 7, 12, 32768, 65535})
    {
        source_.options.marker_size = size;
        EXPECT_EQ(apply().code, 0);
        EXPECT_EQ(readFile(out), std::to_string(size) + '\n');
    }
}

TEST_F(MergeDriverEntry, ChoosesPathAndModeEachByItself)
{
    const std::string out = folder() / "path";
    defineScript("printf %s \"$5\" >" + out);
    const auto pathFor = [this](const char *ancestor, const char *ours, const char *theirs)
    {
        ancestor_.path = ancestor;
        ours_.path = ours;
        theirs_.path = theirs;
        return apply().path;
    };
    // Equal bytes at another address count as equal.
    const std::string copy = "file";
    EXPECT_EQ(pathFor("file", copy.c_str(), "new"), "new");
    EXPECT_EQ(pathFor("file", "new", "file"), "new");
    EXPECT_EQ(pathFor("file", "new", "other"), "new");
    EXPECT_EQ(pathFor("file", "File", "other"), "File");
    EXPECT_EQ(pathFor("file", "file", "file"), "file");
    EXPECT_EQ(pathFor("file", "file", "sub/\xC3\xA9"), "sub/\xC3\xA9");
    EXPECT_EQ(readFile(out), "sub/\xC3\xA9");
    const auto modeFor = [this](std::uint32_t ancestor, std::uint32_t ours, std::uint32_t theirs)
    {
        ancestor_.mode = ancestor;
        ours_.mode = ours;
        theirs_.mode = theirs;
        return apply().mode;
    };
    EXPECT_EQ(modeFor(0100644, 0100644, 0100755), 0100755U);
    EXPECT_EQ(modeFor(0100644, 0100755, 0100644), 0100755U);
    EXPECT_EQ(modeFor(0100755, 0100644, 0100755), 0100644U);
    EXPECT_EQ(modeFor(0100644, 0100755, 0120000), 0100755U);
}

TEST_F(MergeDriverEntry, ReplacesAnExceptionThatWaitsInTheSlotOnlyWhenOneIsRaised)
{
    const auto earlier = std::make_exception_ptr(std::domain_error("earlier"));
    defineScript("exit 1");
    git::storeCallbackException(std::exception_ptr(earlier));
    Answer answer = apply();
    EXPECT_EQ(answer.code, GIT_EMERGECONFLICT);
    EXPECT_EQ(answer.exception, earlier);
    repository_.git({"config", "merge.tool.driver", "/nowhere/tool"});
    git::storeCallbackException(std::exception_ptr(earlier));
    answer = apply();
    EXPECT_EQ(answer.code, GIT_EUSER);
    EXPECT_THROW(std::rethrow_exception(answer.exception), std::system_error);
}

TEST_F(MergeDriverEntry, EndsTheProcessWhenTheReportOfAnExceptionFails)
{
    repository_.git({"config", "merge.tool.driver", "/nowhere/tool"});
    LogCapture log(0x10);
    log.onRecord([](const LogRecord &) { throw std::domain_error("sink"); });
    EXPECT_EXIT(apply(), testing::KilledBySignal(SIGABRT), "");
}

TEST(MergeDriverGuard, TellsOfTheEndBeforeIt)
{
    LibGit2Recorder calls;
    LogCapture log;
    std::vector<std::string> callsBefore;
    log.onRecord([&](const LogRecord &) { callsBefore = calls.names(); });
    {
        const git::LibGit2Guard guard;
        EXPECT_THAT(log.messages(), IsEmpty());
    }
    EXPECT_THAT(log.messages(), ElementsAre("Unregister merge driver: *"));
    EXPECT_THAT(callsBefore, ElementsAre("git_libgit2_init", "git_merge_driver_register"));
}

} // namespace
