// SPDX-License-Identifier: MIT
#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <typeinfo>

#include <boost/variant/get.hpp>
#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "GitConfigFixture.hpp"
#include "main/branches/BranchFixture.hpp"
#include "support/libgit2/LibGit2Recorder.hpp"
#include "support/libgit2Release.hpp"
#include "support/text.hpp"
#include "vclink/git/GitAttributes.hpp"
#include "vclink/git/GitException.hpp"

namespace
{

namespace git = vclink::git;
using testing::ElementsAre;
using namespace vclink::test;

class AttributeCalls : public BranchFixture
{
  protected:
    AttributeCalls()
    {
        repository_.write(".gitattributes", "* x=raw\n");
    }
    std::unique_ptr<git::GitAttributes> create() const
    {
        return git::GitAttributes::create(*adapter_);
    }
};

TEST_F(AttributeCalls, OfTheCreationFlushARepositoryThatIsReleasedAtOnce)
{
    LibGit2Recorder calls;
    create();
    EXPECT_THAT(calls.steps(), ElementsAre("git_repository_open_ext", "git_attr_cache_flush",
                                           "git_repository_free"));
}

TEST_F(AttributeCalls, OfAQueryAreTheseInOrder)
{
    const auto attributes = create();
    LibGit2Recorder calls;
    calls.on<git_attr_get>([](const char **, git_repository *, std::uint32_t flags, const char *,
                              const char *) { EXPECT_EQ(flags, 0U); });
    attributes->getAttribute(asPath("a"), u"x");
    attributes->getAttribute(asPath("a"), u"x");
    const std::vector<std::string> ofOne{
        "git_error_clear", "git_repository_open_ext", "git_repository_workdir", "git_error_clear",
        "git_attr_get",    "git_attr_value",          "git_repository_free"};
    std::vector<std::string> ofBoth = ofOne;
    ofBoth.insert(ofBoth.end(), ofOne.begin(), ofOne.end());
    EXPECT_EQ(calls.names(), ofBoth);
}

TEST_F(AttributeCalls, ThatGiveAnUnknownStateAreRaisedWithTheRawValue)
{
    const auto attributes = create();
    LibGit2Recorder calls;
    int unknown = 4;
    calls.answer<git_attr_value>([&](auto...) { return static_cast<git_attr_value_t>(unknown); });
    try
    {
        attributes->getAttribute(asPath("a"), u"x");
        FAIL() << "no exception";
    }
    catch (const git::GitException &exception)
    {
        const vclink::exception::SourceControlException &base = exception;
        EXPECT_EQ(typeid(base), typeid(git::GitException));
        EXPECT_EQ(exception.GetID(), "shared_vclink:git:InvalidGitAttributeValue");
        const auto &arguments = exception.GetBaseMsgIDObj().getArguments();
        ASSERT_EQ(arguments.size(), 1U);
        EXPECT_EQ(boost::get<std::string>(arguments[0]), "raw");
    }
    EXPECT_EQ(calls.steps().back(), "git_repository_free");
}

using ConfigCalls = GitConfigFixture;

TEST_F(ConfigCalls, OfALifeAreTheseInOrder)
{
    LibGit2Recorder calls;
    {
        const git::GitConfig config;
        EXPECT_THAT(calls.steps(),
                    ElementsAre("git_libgit2_init", "git_merge_driver_register",
                                "git_config_open_default", "git_config_open_global"));
        calls.clear();
    }
    EXPECT_THAT(calls.steps(), ElementsAre("git_config_free", "git_config_free",
                                           "git_merge_driver_unregister", "git_libgit2_shutdown"));
}

TEST_F(ConfigCalls, OfAWriteAReadAndThePathAreOneEach)
{
    using vclink::test::libgit2_release::endsAtBrokenFiles;
    const InstallPath installation("/opt/host");
    writeFile(global(), "");
    git::GitConfig config;
    LibGit2Recorder calls;
    config.writeDiffTool();
    EXPECT_NE(config.readDiffTool(), std::nullopt);
    EXPECT_NE(config.globalFilePath(), std::nullopt);
    const auto steps = calls.steps();
    if (endsAtBrokenFiles)
    {
        EXPECT_THAT(steps,
                    ElementsAre("git_config_find_xdg", "git_config_find_global",
                                "git_config_snapshot", "git_config_free", "git_config_set_string",
                                "git_config_snapshot", "git_config_get_string_buf",
                                "git_config_free", "git_config_find_global"));
    }
    else
    {
        EXPECT_THAT(steps,
                    ElementsAre("git_config_find_xdg", "git_config_find_global",
                                "git_config_snapshot", "git_config_free", "git_config_set_string",
                                "git_config_get_string_buf", "git_config_find_global"));
    }
}

} // namespace
