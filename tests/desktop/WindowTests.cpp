// SPDX-License-Identifier: MIT
// What the window shows by itself: states, changes from outside, the language, the log.
#include <chrono>
#include <set>
#include <stdexcept>
#include <string>

#include <QIcon>
#include <QLineEdit>
#include <QPlainTextEdit>
#include <QTreeView>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "DesktopFixture.hpp"
#include "language.hpp"
#include "text.hpp"

namespace
{

using namespace vclink::test;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::Not;
using vclink::desktop::LogPane;
using vclink::desktop::toUtf8;

class Window : public DesktopFixture
{
  protected:
    Window()
    {
        for (const auto *name : {"clean", "gone", "edited"})
            repository_.write(name, "first\n");
        repository_.commitAll("first");
        repository_.remove("gone");
        repository_.write("edited", "second\n");
        repository_.write("New", "new\n");
    }
    ~Window() override
    {
        vclink::desktop::setLanguage(QStringLiteral("en"));
    }
    /// Waits until a command is called so.
    bool says(const char *text)
    {
        return waitFor([&] { return find<QAction>("switch").text() == QString::fromUtf8(text); });
    }
    QAbstractItemModel &list()
    {
        return *find<QTreeView>("files").model();
    }
    /// A column of the list, from above.
    std::vector<std::string> column(int number)
    {
        std::vector<std::string> texts;
        for (int row = 0; row < list().rowCount(); ++row)
            texts.push_back(toUtf8(list().index(row, number).data().toString()));
        return texts;
    }
};

TEST_F(Window, ListsStatesWithAColourAndAnIconEach)
{
    open();
    EXPECT_THAT(column(0), ElementsAre("unversioned", "modified", "missing"));
    EXPECT_THAT(column(1), ElementsAre("New", "edited", "gone"));
    std::set<QRgb> colours;
    for (int row = 0; row < list().rowCount(); ++row)
    {
        const QModelIndex index = list().index(row, 0);
        colours.insert(index.data(Qt::ForegroundRole).value<QColor>().rgb());
        EXPECT_FALSE(index.data(Qt::DecorationRole).value<QIcon>().isNull());
    }
    EXPECT_EQ(colours.size(), 3u);
}

TEST_F(Window, SortsAndFiltersTheList)
{
    open();
    find<QTreeView>("files").sortByColumn(0, Qt::AscendingOrder);
    EXPECT_THAT(column(1), ElementsAre("gone", "edited", "New"));
    find<QLineEdit>("filter").setText("E");
    EXPECT_THAT(column(1), ElementsAre("gone", "edited", "New"));
    find<QLineEdit>("filter").setText("ed");
    EXPECT_THAT(column(1), ElementsAre("edited"));
    find<QLineEdit>("filter").clear();
    find<QComboBox>("shown").setCurrentIndex(1);
    EXPECT_THAT(column(1), testing::Contains("clean"));
}

TEST_F(Window, FollowsFilesThatChangeAndKeepsTheSelection)
{
    open();
    select({"New"});
    repository_.write("clean", "second\n");
    EXPECT_TRUE(becomes("clean", "modified"));
    repository_.write("folder/deep/file", "new\n");
    EXPECT_TRUE(becomes("folder/deep/file", "unversioned"));
    repository_.add({"folder/deep/file"});
    EXPECT_TRUE(becomes("folder/deep/file", "added"));
    repository_.write("folder/deep/other", "new\n");
    EXPECT_TRUE(becomes("folder/deep/other", "unversioned"));
    repository_.git({"checkout", "--quiet", "-b", "topic"});
    EXPECT_TRUE(waitFor([this] { return find<QLabel>("branch").text() == "topic"; }));
    EXPECT_EQ(window().files().selection(),
              std::vector<upath>{host_tools::toUpath(repository_ / "New")});
}

TEST_F(Window, ReadsTheStatesSeldomWhileManyFilesChange)
{
    open();
    const auto *before = &window().snapshot();
    int reads = 0;
    const auto end = std::chrono::steady_clock::now() + std::chrono::milliseconds(1'600);
    for (int file = 0; std::chrono::steady_clock::now() < end; ++file)
    {
        repository_.write("New", std::to_string(file));
        QCoreApplication::processEvents();
        if (&window().snapshot() != before)
        {
            before = &window().snapshot();
            ++reads;
        }
    }
    EXPECT_GE(reads, 1);
    EXPECT_LE(reads, 4);
}

TEST_F(Window, SaysWhatIsNoWorkingCopy)
{
    openEmpty().open(host_tools::toUpath(folder().path()));
    EXPECT_THAT(takeMessage(), HasSubstr("Not a working copy"));
    EXPECT_FALSE(find<QAction>("commit").isEnabled());
    EXPECT_TRUE(find<QAction>("clone").isEnabled());
}

TEST_F(Window, ChangesItsLanguageAndThatOfTheLibrary)
{
    open();
    find<QAction>("de").trigger();
    EXPECT_TRUE(says("Wechseln…"));
    EXPECT_THAT(column(0), ElementsAre("nicht versioniert", "geändert", "fehlt"));
    repository_.write(".git/index.lock", "");
    select({"New"});
    choose("add");
    EXPECT_THAT(takeMessage(), HasSubstr("Git konnte"));
    find<QAction>("ja").trigger();
    EXPECT_TRUE(says("切り替え…"));
    choose("add");
    EXPECT_THAT(takeMessage(), Not(HasSubstr("Git konnte")));
    find<QAction>("en").trigger();
    EXPECT_TRUE(says("Switch…"));
    EXPECT_THAT(column(0), ElementsAre("unversioned", "modified", "missing"));
}

TEST_F(Window, ShowsTheLibrarysLogWhenItIsAsked)
{
    open();
    auto &log = find<QPlainTextEdit>("log");
    select({"New"});
    choose("add");
    settle();
    EXPECT_EQ(log.toPlainText(), "");
    find<QComboBox>("severities").setCurrentIndex(2);
    choose("remove");
    settle();
    EXPECT_TRUE(waitFor([&log] { return log.toPlainText().contains("Unregister merge driver"); }))
        << toUtf8(log.toPlainText());
}

TEST_F(Window, IsNotHarmedByASinkOfTheLogThatFails)
{
    int failures = 0;
    const vclink::desktop::LogSink sink(
        [&failures](const std::string &)
        {
            ++failures;
            throw std::runtime_error("full");
        });
    open();
    LogPane::setSeverities(LogPane::everything);
    select({"New"});
    choose("add");
    settle();
    LogPane::setSeverities(0);
    EXPECT_GT(failures, 10);
    EXPECT_EQ(status(), "A  New\n M edited\n D gone");
}

} // namespace
