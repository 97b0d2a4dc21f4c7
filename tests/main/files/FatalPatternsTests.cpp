// SPDX-License-Identifier: MIT
#include "util/repository/fatalPatterns.hpp"

#include <array>
#include <chrono>
#include <csignal>
#include <cstddef>
#include <filesystem>
#include <functional>
#include <random>
#include <string>
#include <vector>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/stat.h>

#include "CommitFixture.hpp"
#include "support/ChildProcess.hpp"
#include "vclink/git/BranchManager.hpp"
#include "vclink/git/GitException.hpp"

namespace
{

using testing::HasSubstr;
using vclink::git::findFatalPattern;
using vclink::git::PatternFault;
using vclink::git::PatternPlace;
using namespace vclink::test;

class FatalPatterns : public CommitFixture
{
  protected:
    /// Whether libgit2 comes to an end with these patterns.
    bool isFatal(const std::string &patterns, std::chrono::milliseconds timeout) const
    {
        repository_.write(".gitignore", patterns);
        const std::string end = runInChild(
            [this]
            {
                std::signal(SIGSEGV, SIG_DFL);
                git_repository *repository = nullptr;
                int isIgnored = 0;
                git_repository_open(&repository, repository_.path().c_str());
                git_ignore_path_is_ignored(&isIgnored, repository, "name");
                git_repository_free(repository);
                return std::string();
            },
            timeout);
        return !end.empty();
    }

    /// Returns why a query of the states fails, in a child because it might never end.
    std::string queryInChild() const
    {
        return runInChild(
            [this]
            {
                const auto adapter = makeAdapter(repository_.path());
                adapter->getFolderStates(adapter->getRootFolder());
                return std::string();
            },
            std::chrono::seconds(30));
    }

    void expectRefused(const std::function<void()> &action) const
    {
        const Failure failure = failureOf(action);
        EXPECT_EQ(failure.code, GIT_ERROR);
        EXPECT_EQ(failure.errorClass, GIT_ERROR_REPOSITORY);
        EXPECT_THAT(failure.text, HasSubstr("line 2 of '" + repository_.path().string()));
    }

    /// @param untracked a file that an addition would look for patterns of
    void expectEachOperationRefused(const std::string &untracked)
    {
        const auto adapter = makeAdapter(repository_.path());
        const auto branches = vclink::git::BranchManager::create(*adapter);
        expectRefused([&] { adapter->getFolderStates(asPath(repository_.path())); });
        expectRefused([&] { add({untracked}); });
        expectRefused([this] { remove({"file"}); });
        expectRefused([this] { markResolved("file"); });
        expectRefused([this] { revert({"file"}); });
        expectRefused([this] { commit(); });
        expectRefused([&] { branches->switchBranch("topic"); });
        EXPECT_THROW(branches->merge("topic"), vclink::git::GitException);
        EXPECT_EQ(repository_.read("file"), "edited\n");
    }
};

TEST_F(FatalPatterns, AreThoseAtWhichLibGit2EndsTheProcess)
{
    constexpr std::array<const char *, 10> pieces{"!",  "!", "/",  "/", "\\",
                                                  "\r", " ", "\t", "a", "\n"};
    std::mt19937 random(1);
    int fatal = 0;
    for (int i = 0; i < 150; ++i)
    {
        std::string text = i % 5 == 0 ? "a\n!" : "x*\n!";
        for (std::size_t size = random() % 5; size > 0; --size)
            text += pieces.at(random() % pieces.size());
        const bool isFound = findFatalPattern(text).fault == PatternFault::EndsProcess;
        EXPECT_EQ(isFound, isFatal(text, std::chrono::seconds(30))) << testing::PrintToString(text);
        fatal += isFound ? 1 : 0;
    }
    EXPECT_GT(fatal, 5);
    for (const std::string text : {"x*\n!//\n", "x*\n!\\\r\n", "\xEF\xBB\xBFx*\n! //\n!/\\"})
        EXPECT_EQ(findFatalPattern(text).fault, PatternFault::EndsProcess);
}

TEST_F(FatalPatterns, AreThoseAtWhichLibGit2NeverEnds)
{
    for (const std::string text : {"\f", "a\n\v\n", "!\f", "/\fa", " \f", "\r\f"})
    {
        EXPECT_EQ(findFatalPattern(text).fault, PatternFault::NeverEnds);
        EXPECT_TRUE(isFatal(text, std::chrono::milliseconds(300))) << testing::PrintToString(text);
    }
    for (const std::string text : {"a\fb", "\\\f", "#\f", "a\n#b\v\n", "\\\n \v", ""})
    {
        EXPECT_EQ(findFatalPattern(text).fault, PatternFault::None);
        EXPECT_FALSE(isFatal(text, std::chrono::seconds(30))) << testing::PrintToString(text);
    }
}

TEST_F(FatalPatterns, StopEachOperationThatReadsThem)
{
    repository_.makeBranch("topic", writes("file", "of topic\n"));
    repository_.write("file", "edited\n");
    repository_.write("new", "x");
    for (const std::string name : {".gitignore", ".git/info/exclude"})
    {
        for (const std::string line : {"!//", "\f"})
        {
            repository_.write(name, "*.o\n" + line + "\n");
            SCOPED_TRACE(name);
            expectEachOperationRefused("new");
            repository_.write(name, "*.o\n");
        }
    }
    add({"new"});
    EXPECT_THAT(status(), testing::Contains("A  new"));
}

TEST_F(FatalPatterns, InAFolderAreThoseAtWhichLibGit2NeverEnds)
{
    EXPECT_EQ(findFatalPattern("x*\n!//\n", PatternPlace::Folder).fault, PatternFault::None);
    const auto found = findFatalPattern("x*\n!//\n\f\n", PatternPlace::Folder);
    EXPECT_EQ(found.fault, PatternFault::NeverEnds);
    EXPECT_EQ(found.number, 3);
    repository_.write("folder/.gitignore", "x*\n!//\n");
    repository_.commitAll("patterns");
    EXPECT_EQ(queryInChild(), "");
}

TEST_F(FatalPatterns, InATrackedFileOfAFolderStopEachOperationThatReadsThem)
{
    repository_.write("folder/.gitignore", "*.o\n");
    repository_.commitAll("patterns");
    repository_.makeBranch("topic", writes("file", "of topic\n"));
    repository_.write("folder/.gitignore", "*.o\n\f\n");
    repository_.write("file", "edited\n");
    repository_.write("folder/new", "x");
    ASSERT_THAT(queryInChild(), HasSubstr("would keep the operation from ending"));
    expectEachOperationRefused("folder/new");
    repository_.write("folder/.gitignore", "*.o\n");
    add({"folder/new"});
    EXPECT_THAT(status(), testing::Contains("A  folder/new"));
}

TEST_F(FatalPatterns, InASubmoduleStopAQuery)
{
    GitRepository other = makeRepository("other");
    other.write("folder/.gitignore", "*.o\n");
    other.commitAll("patterns");
    repository_.git(
        {"-c", "protocol.file.allow=always", "submodule", "add", other.path().string(), "library"});
    repository_.commitAll("submodule");
    for (const std::string name : {"library/.gitignore", "library/folder/.gitignore"})
    {
        repository_.write(name, "*.o\n\f\n");
        EXPECT_THAT(queryInChild(),
                    HasSubstr("line 2 of '" + (repository_.path() / name).string()));
        repository_.write(name, "*.o\n");
    }
    repository_.write("library/.gitignore", "*.o\n!//\n");
    EXPECT_THAT(queryInChild(), HasSubstr("would end the process"));
    std::filesystem::remove_all(repository_.path() / "library");
    EXPECT_EQ(queryInChild(), "");
}

TEST_F(FatalPatterns, AFifoInTheirPlaceStopsAQuery)
{
    repository_.write("folder/.gitignore", "*.o\n");
    repository_.commitAll("patterns");
    for (const std::string name : {".gitignore", "folder/.gitignore", ".git/info/exclude"})
    {
        const auto path = repository_.path() / name;
        std::filesystem::create_directories(path.parent_path());
        std::filesystem::remove(path);
        ASSERT_EQ(mkfifo(path.c_str(), 0600), 0);
        EXPECT_THAT(queryInChild(), HasSubstr("'" + path.string() + "' is a FIFO"));
        std::filesystem::remove(path);
    }
    EXPECT_EQ(queryInChild(), "");
}

} // namespace
