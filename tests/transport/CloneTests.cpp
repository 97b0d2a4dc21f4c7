// SPDX-License-Identifier: MIT
#include <filesystem>
#include <string>

#include <gtest/gtest.h>

#include "TransportFixture.hpp"

namespace
{

using namespace vclink::test;

class Clone : public TransportFixture
{
  protected:
    /// Branches, tags of both kinds, and files of every kind that a tree holds.
    void fillServer()
    {
        change("folder/ä file", "text\n");
        source_.write("program", "#!/bin/sh\n");
        source_.setMode("program", 0755);
        source_.symlink("folder/ä file", "link");
        source_.commitAll("more");
        source_.git({"tag", "light"});
        source_.git({"-c", "user.name=a", "-c", "user.email=a@example.com", "tag", "-m", "tag",
                     "annotated"});
        source_.git({"switch", "--quiet", "--create", "topic/one"});
        change("topic", "topic\n");
        publish({"--all"});
        publish({"--tags"});
    }
    /// Expects two clones of one repository to be the same.
    static void expectEqual(const GitRepository &clone, const GitRepository &clonedByGit)
    {
        EXPECT_EQ(referencesOf(clone), referencesOf(clonedByGit));
        EXPECT_EQ(clone.line({"symbolic-ref", "HEAD"}), clonedByGit.line({"symbolic-ref", "HEAD"}));
        EXPECT_EQ(clone.git({"ls-files", "--stage"}), clonedByGit.git({"ls-files", "--stage"}));
        for (const char *key : {"remote.origin.url", "remote.origin.fetch", "branch.main.remote",
                                "branch.main.merge", "core.bare"})
            EXPECT_EQ(clone.tryGit({"config", key}).output,
                      clonedByGit.tryGit({"config", key}).output)
                << key;
    }
};

TEST_P(Clone, IsWhatGitsCloneIs)
{
    fillServer();
    const auto cloned = clone(url_, "clone");
    expectEqual(cloned, cloneWithGit("cloned by git"));
    expectSound(cloned);
    EXPECT_EQ(cloned.read("link"), "text\n");
}

TEST_P(Clone, OfAnEmptyRepositoryHasNoCommitYet)
{
    const auto cloned = clone(url_, "clone");
    EXPECT_EQ(referencesOf(cloned), "");
    EXPECT_EQ(cloned.line({"config", "remote.origin.url"}), url_);
    expectSound(cloned);
}

TEST_P(Clone, TakesAlongWhatIsLargerThanABuffer)
{
    std::string noise;
    for (unsigned i = 0, state = 1; i < 1'000'000; ++i)
    {
        state = state * 1'664'525 + 1'013'904'223;
        noise += static_cast<char>(state >> 24);
    }
    change("noise", noise);
    publish({"HEAD:refs/heads/main"});
    const auto cloned = clone(url_, "clone");
    EXPECT_EQ(cloned.read("noise"), noise);
    expectSound(cloned);
}

TEST_P(Clone, OfWhatIsNotThereFailsAndLeavesNoFolder)
{
    const auto failure = failureOf([this] { clone(url_ + "-missing", "clone"); });
    EXPECT_LT(failure.code, 0);
    EXPECT_NE(failure.text, "");
    EXPECT_FALSE(std::filesystem::exists(folder() / "clone"));
}

TEST_P(Clone, WorksAfterOneThatFailed)
{
    const std::string id = change("file", "text\n");
    publish({"HEAD:refs/heads/main"});
    const auto generator = makeGenerator();
    const auto cloneFrom = [&](const std::string &url)
    { generator->generate(asUtf16(url), asPath(folder() / "clone")); };
    failureOf([&] { cloneFrom(url_ + "-missing"); });
    cloneFrom(url_);
    EXPECT_EQ(GitRepository(folder() / "clone").line({"rev-parse", "HEAD"}), id);
}

INSTANTIATE_TEST_SUITE_P(Over, Clone, allTransports(), testing::PrintToStringParamName());

} // namespace
