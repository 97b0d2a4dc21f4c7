// SPDX-License-Identifier: MIT
#include <memory>
#include <optional>
#include <string>
#include <typeinfo>

#include <boost/variant/get.hpp>
#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "BranchCalls.hpp"
#include "BranchTest.hpp"
#include "GitConfigTest.hpp"
#include "support/text.hpp"
#include "vclink/git/GitAttributes.hpp"
#include "vclink/git/GitException.hpp"

namespace
{

namespace git = vclink::git;
using testing::ElementsAre;
using vclink::test::asPath;
using vclink::test::BranchCalls;
using vclink::test::LibGit2Failure;
using vclink::test::libGit2FailureOf;

const LibGit2Failure injected{GIT_ERROR, GIT_ERROR_OS, "injected"};

class AttributeCalls : public vclink::test::BranchTest
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
    BranchCalls calls;
    create();
    EXPECT_THAT(calls.names,
                ElementsAre("repository_open_ext", "attr_cache_flush", "repository_free"));
}

TEST_F(AttributeCalls, OfTheFlushMayFail)
{
    BranchCalls calls;
    calls.failing["attr_cache_flush"] = GIT_ERROR;
    EXPECT_EQ(serialize(create()->getAttribute(asPath("a"), u"x")), "x=raw");
}

TEST_F(AttributeCalls, OfAQueryAreTheseInOrder)
{
    const auto attributes = create();
    BranchCalls calls;
    attributes->getAttribute(asPath("a"), u"x");
    attributes->getAttribute(asPath("a"), u"x");
    EXPECT_THAT(calls.names,
                ElementsAre("repository_open_ext", "attr_get", "attr_value", "repository_free",
                            "repository_open_ext", "attr_get", "attr_value", "repository_free"));
    EXPECT_THAT(calls.attributeFlags, testing::Each(0U));
}

TEST_F(AttributeCalls, OfAQueryAreRaisedWhenTheyFail)
{
    const auto attributes = create();
    for (const std::string name : {"repository_open_ext", "attr_get"})
    {
        BranchCalls calls;
        calls.failing[name] = GIT_ERROR;
        EXPECT_EQ(libGit2FailureOf([&] { attributes->getAttribute(asPath("a"), u"x"); }), injected)
            << name;
        EXPECT_EQ(calls.names.back(), name == "attr_get" ? "repository_free" : name);
    }
}

TEST_F(AttributeCalls, OfTheCreationAreRaisedWhenTheRepositoryCannotBeOpened)
{
    BranchCalls calls;
    calls.failing["repository_open_ext"] = GIT_ERROR;
    EXPECT_EQ(libGit2FailureOf([&] { create(); }), injected);
}

TEST_F(AttributeCalls, ThatGiveAnUnknownStateAreRaisedWithTheRawValue)
{
    const auto attributes = create();
    BranchCalls calls;
    calls.onAttributeValue = [] { return 4; };
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
    EXPECT_EQ(calls.names.back(), "repository_free");
}

class ConfigCalls : public vclink::test::GitConfigTest
{
};

TEST_F(ConfigCalls, OfALifeAreTheseInOrder)
{
    BranchCalls calls;
    {
        const git::GitConfig config;
        EXPECT_THAT(calls.names, ElementsAre("libgit2_init", "merge_driver_register",
                                             "config_open_default", "config_open_global"));
        calls.names.clear();
    }
    EXPECT_THAT(calls.names, ElementsAre("config_free", "config_free", "merge_driver_unregister",
                                         "libgit2_shutdown"));
}

TEST_F(ConfigCalls, OfTheConstructorAreRaisedAndWhatWasOpenedIsReleased)
{
    {
        BranchCalls calls;
        calls.failing["config_open_default"] = GIT_ERROR;
        EXPECT_EQ(libGit2FailureOf([] { git::GitConfig config; }), injected);
        EXPECT_THAT(calls.names,
                    ElementsAre("libgit2_init", "merge_driver_register", "config_open_default",
                                "merge_driver_unregister", "libgit2_shutdown"));
    }
    BranchCalls calls;
    calls.failing["config_open_global"] = GIT_ERROR;
    EXPECT_EQ(libGit2FailureOf([] { git::GitConfig config; }), injected);
    EXPECT_THAT(calls.names, ElementsAre("libgit2_init", "merge_driver_register",
                                         "config_open_default", "config_open_global", "config_free",
                                         "merge_driver_unregister", "libgit2_shutdown"));
}

TEST_F(ConfigCalls, OfAReadAreOneAndDroppedWhenTheyFail)
{
    const vclink::test::InstallPath installation("/opt/host");
    git::GitConfig config;
    config.writeDiffTool();
    BranchCalls calls;
    EXPECT_NE(config.readDiffTool(), std::nullopt);
    EXPECT_THAT(calls.names, ElementsAre("config_get_string_buf"));
    for (const int code : {GIT_ERROR, GIT_ENOTFOUND, GIT_EUSER})
    {
        calls.failing["config_get_string_buf"] = code;
        EXPECT_EQ(config.readDiffTool(), std::nullopt);
        EXPECT_EQ(config.readMergeTool(), std::nullopt);
        EXPECT_EQ(config.readAutoMergeDriver(), std::nullopt);
    }
}

TEST_F(ConfigCalls, OfAWriteReadNothingFirstAndAreRaisedWhenTheyFail)
{
    git::GitConfig config;
    BranchCalls calls;
    config.writeMergeTool();
    EXPECT_THAT(calls.names, ElementsAre("config_set_string"));
    calls.failing["config_set_string"] = GIT_ERROR;
    EXPECT_EQ(libGit2FailureOf([&] { config.writeMergeTool(); }), injected);
    EXPECT_EQ(libGit2FailureOf([&] { config.writeDiffTool(); }), injected);
    EXPECT_EQ(libGit2FailureOf([&] { config.writeAutoMergeDriver(); }), injected);
}

TEST_F(ConfigCalls, OfThePathAreOneAndDroppedWhenTheyFail)
{
    git::GitConfig config;
    config.writeMergeTool();
    BranchCalls calls;
    EXPECT_NE(config.globalFilePath(), std::nullopt);
    EXPECT_THAT(calls.names, ElementsAre("config_find_global"));
    calls.failing["config_find_global"] = GIT_ERROR;
    EXPECT_EQ(config.globalFilePath(), std::nullopt);
}

} // namespace
