// SPDX-License-Identifier: MIT
// From a merge with conflicts to the commit that concludes it.
#include <filesystem>
#include <string>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "ConflictDialog.hpp"
#include "DesktopFixture.hpp"
#include "fl/filesystem/operations.hpp"
#include "support/Change.hpp"
#include "support/Scripts.hpp"
#include "text.hpp"
#include "vclink_host/installation.hpp"

namespace
{

using namespace vclink::test;
using testing::HasSubstr;
using vclink::desktop::ConflictDialog;

class Conflicts : public DesktopFixture
{
  protected:
    Conflicts()
    {
        repository_.write("a", "first\n");
        repository_.write("b", "first\n");
        repository_.commitAll("first");
        repository_.makeBranch("topic", writes("a", "theirs\n") + removes("b"));
        repository_.write("a", "ours\n");
        repository_.write("b", "ours\n");
        repository_.commitAll("ours");
    }
    ~Conflicts() override
    {
        vclink_host::setInstallPath(installed_);
    }
    /// Merges, and waits for the versions of the first file.
    ConflictDialog &merge()
    {
        open();
        choose("merge");
        fill({"topic"});
        auto &dialog = shown<ConflictDialog>();
        if (!waitFor([&dialog] { return dialog.hasSides(); }))
            throw std::runtime_error("no versions are shown");
        settle();
        return dialog;
    }
    std::string pane(const char *name)
    {
        return vclink::desktop::toUtf8(find<QPlainTextEdit>(name).toPlainText());
    }
    /// Has the host's merge tool do this with BASE, LOCAL, REMOTE and MERGED.
    void installTool(const std::string &body)
    {
        const auto bin = folder() / "installed/bin/lnxhost";
        std::filesystem::create_directories(bin);
        Scripts scripts(folder() / "scripts");
        std::filesystem::rename(scripts.shell(body), bin / "vkMerge");
        vclink_host::setInstallPath(host_tools::toUpath(folder() / "installed").string());
    }
    bool runTool(ConflictDialog &dialog)
    {
        auto &button = find<QPushButton>("mergeTool");
        button.click();
        EXPECT_TRUE(dialog.isToolOpen());
        dialog.reject();
        EXPECT_TRUE(dialog.isVisible());
        return waitFor([&dialog] { return !dialog.isToolOpen(); });
    }

  private:
    ustring installed_ = fl::filesystem::get_install_path();
};

TEST_F(Conflicts, AreListedWithTheirThreeSides)
{
    merge();
    EXPECT_EQ(find<QListWidget>("conflictFiles").count(), 2);
    EXPECT_EQ(pane("ancestor"), "first\n");
    EXPECT_EQ(pane("ours"), "ours\n");
    EXPECT_EQ(pane("theirs"), "theirs\n");
    EXPECT_THAT(pane("working"), HasSubstr("<<<<<<<"));
    find<QListWidget>("conflictFiles").setCurrentRow(1);
    EXPECT_TRUE(waitFor([this] { return pane("theirs") == "(not there)"; }));
    EXPECT_EQ(pane("ancestor"), "first\n");
}

TEST_F(Conflicts, AreResolvedMarkedAndConcluded)
{
    auto &dialog = merge();
    auto &conclude = find<QPushButton>("conclude");
    EXPECT_FALSE(conclude.isEnabled());
    choose("commit");
    EXPECT_EQ(takeMessage(), "Resolve the files in conflict first.");
    for (const auto *name : {"a", "b"})
    {
        repository_.write(name, "both\n");
        find<QPushButton>("resolved").click();
        ASSERT_TRUE(becomes(name, "modified"));
        settle();
    }
    ASSERT_TRUE(waitFor([&conclude] { return conclude.isEnabled(); }));
    conclude.click();
    EXPECT_FALSE(dialog.isVisible());
    auto &form = shown<vclink::desktop::FormDialog>();
    EXPECT_THAT(vclink::desktop::toUtf8(form.findChild<QPlainTextEdit *>()->toPlainText()),
                HasSubstr("Merge"));
    fill({"Both"});
    settle();
    EXPECT_EQ(repository_.line({"rev-list", "--parents", "--count", "HEAD^2"}), "2");
    EXPECT_EQ(repository_.line({"log", "-1", "--format=%s"}), "Both");
    EXPECT_EQ(repository_.read("a"), "both\n");
    EXPECT_EQ(status(), "");
}

TEST_F(Conflicts, AreSolvedByTheHostsMergeTool)
{
    installTool("cat \"$1\" \"$2\" \"$3\" >\"$4\"");
    auto &dialog = merge();
    ASSERT_TRUE(runTool(dialog));
    EXPECT_EQ(repository_.read("a"), "first\nours\ntheirs\n");
    EXPECT_EQ(pane("working"), "first\nours\ntheirs\n");
}

TEST_F(Conflicts, StayAsTheyAreIfTheMergeToolFails)
{
    installTool("echo lost >\"$4\"; exit 1");
    auto &dialog = merge();
    const std::string before = repository_.read("a");
    ASSERT_TRUE(runTool(dialog));
    EXPECT_EQ(takeMessage(), "The merge tool left the file as it was.");
    EXPECT_EQ(repository_.read("a"), before);
}

TEST_F(Conflicts, KeepWhatWasWrittenWhileTheMergeToolWasOpen)
{
    auto &dialog = merge();
    installTool("echo work >" + (repository_ / "a").string() + "; echo merged >\"$4\"");
    ASSERT_TRUE(runTool(dialog));
    EXPECT_THAT(takeMessage(), HasSubstr("left alone"));
    EXPECT_EQ(repository_.read("a"), "work\n");
}

TEST_F(Conflicts, SayWhenThereIsNoMergeTool)
{
    vclink_host::setInstallPath(host_tools::toUpath(folder() / "nothing").string());
    merge();
    find<QPushButton>("mergeTool").click();
    EXPECT_THAT(takeMessage(), HasSubstr("No such file"));
}

} // namespace
