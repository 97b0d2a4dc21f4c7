// SPDX-License-Identifier: MIT
#include <optional>
#include <string>

#include <gtest/gtest.h>

#include "GitConfigFixture.hpp"
#include "main/toolCommands.hpp"

namespace
{

using vclink::git::autoMergeDriver;
using vclink::git::ConfigKey;
using vclink::git::configKeyString;
using vclink::git::diffTool;
using vclink::git::mergeTool;
using vclink::git::quotedCommand;
using vclink::git::toolLauncherPath;
using vclink::test::InstallPath;

TEST(ToolCommands, HaveTheirPlacesInTheConfigurationAndTheirArguments)
{
    EXPECT_EQ(configKeyString(autoMergeDriver().key), "merge.vkAutoMerge.driver");
    EXPECT_EQ(configKeyString(mergeTool().key), "mergetool.vkMerge.cmd");
    EXPECT_EQ(configKeyString(diffTool().key), "difftool.vkDiff.cmd");
    EXPECT_EQ(autoMergeDriver().key.subsection, "vkAutoMerge");
    EXPECT_EQ(autoMergeDriver().arguments, "%O %A %B %A");
    EXPECT_EQ(mergeTool().arguments, "$PWD/$BASE $PWD/$LOCAL $PWD/$REMOTE $PWD/$MERGED");
    EXPECT_EQ(diffTool().arguments, "$LOCAL $PWD/$REMOTE");
}

TEST(ToolCommands, JoinAKeyWithAndWithoutASubsection)
{
    EXPECT_EQ(configKeyString(ConfigKey{"section", "sub.section", "name"}),
              "section.sub.section.name");
    EXPECT_EQ(configKeyString(ConfigKey{"section", std::nullopt, "name"}), "section.name");
    EXPECT_EQ(configKeyString(ConfigKey{"section", "", "name"}), "section..name");
}

TEST(ToolCommands, StartLaunchersBelowTheInstallationOfTheMoment)
{
    for (const std::string root : {"/opt/host", "/opt/my host", "/opt/gr\xC3\xBC\xC3\x9F",
                                   "/opt/a.b/c.d", "/opt/say \"host\"", "/opt/caf\xE9"})
    {
        const InstallPath installation(root);
        EXPECT_EQ(toolLauncherPath(autoMergeDriver()), root + "/bin/lnxhost/vkAutoMerge.sh");
        EXPECT_EQ(toolLauncherPath(mergeTool()), root + "/bin/lnxhost/vkMerge");
        EXPECT_EQ(toolLauncherPath(diffTool()), root + "/bin/lnxhost/vkDiff");
    }
    const InstallPath installation("/");
    auto tool = mergeTool();
    EXPECT_EQ(toolLauncherPath(tool), "/bin/lnxhost/vkMerge") << "no second slash";
    tool.launcher.clear();
    EXPECT_EQ(toolLauncherPath(tool), "/bin/lnxhost");
}

TEST(ToolCommands, QuoteTheLauncherAndNothingElse)
{
    EXPECT_EQ(quotedCommand("/a b/tool", "%A $X"), "\"/a b/tool\" %A $X");
    EXPECT_EQ(quotedCommand("/a\"b", "x"), "\"/a\"b\" x") << "a quote inside is not escaped";
    EXPECT_EQ(quotedCommand("", ""), "\"\" ");
}

} // namespace
