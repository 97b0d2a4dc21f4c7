// SPDX-License-Identifier: MIT
#include <cstddef>
#include <memory>
#include <stdexcept>
#include <string>
#include <thread>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "error/errorUtil/callbackException.hpp"
#include "error/logging/severity.hpp"
#include "main/AdapterFixture.hpp"
#include "support/LocaleOfTheProcess.hpp"
#include "support/LogCapture.hpp"
#include "support/RepositoryState.hpp"
#include "support/text.hpp"

namespace
{

namespace git = vclink::git;
using testing::Each;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using namespace vclink::test;

ProgressCall message(const ustring &text)
{
    return text;
}

/// Three committed files, to be changed and thrown back.
class RevertProgress : public AdapterFixture
{
  protected:
    RevertProgress()
    {
        git::pendingCallbackException() = nullptr;
        for (const auto &name : names_)
            repository_.write(name, "committed\n");
        repository_.commitAll(writes("other", "committed\n"), "first");
    }
    ~RevertProgress() override
    {
        git::pendingCallbackException() = nullptr;
    }

    void changeAll() const
    {
        for (const auto &name : names_)
            repository_.write(name, "changed, and longer\n");
    }
    void revert(const std::vector<std::string> &names) const
    {
        const std::string root = repository_.path().string() + '/';
        std::vector<upath> files;
        for (const auto &name : names)
            files.push_back(asPath(root + name));
        adapter_->revertFiles(files);
    }
    void revertAll() const
    {
        revert(names_);
    }
    std::vector<ProgressCall> &calls() const
    {
        return interactor_->progress.calls;
    }

    const std::vector<std::string> names_{"a", "folder/b", "c"};
    GitRepository repository_ = makeRepository();
    const std::unique_ptr<git::GitAdapter> adapter_ = makeAdapter(repository_.path());
    LocaleOfTheProcess english_{"C"};
};

TEST_F(RevertProgress, OfThreeFilesTellsEachWithItsFraction)
{
    changeAll();
    revertAll();
    EXPECT_THAT(calls(),
                ElementsAre(0.0, 1.0 / 3, message(u"Checking out a"), 2.0 / 3,
                            message(u"Checking out c"), 1.0, message(u"Checking out folder/b")));
    EXPECT_EQ(repository_.git({"status", "--porcelain"}), "");
}

TEST_F(RevertProgress, CountsTheFilesThatAreWrittenOnly)
{
    repository_.remove("c");
    revertAll();
    EXPECT_THAT(calls(), ElementsAre(0.0, 1.0, message(u"Checking out c")));
    EXPECT_EQ(repository_.read("c"), "committed\n");
}

TEST_F(RevertProgress, WithNothingToDoSetsZeroOnceAndForNoFilesNothing)
{
    const LogCapture log(git::SeverityProgress | git::SeverityParameter);
    revert({});
    EXPECT_THAT(calls(), IsEmpty());
    EXPECT_THAT(log.records(), IsEmpty());
    repository_.write("new", "x");
    revertAll();
    revert({"new"});
    EXPECT_THAT(calls(), ElementsAre(ProgressCall(0.0), ProgressCall(0.0)));
}

TEST_F(RevertProgress, SpeaksTheLanguageOfTheProcess)
{
    const LocaleOfTheProcess german("de");
    repository_.write("a", "changed, and longer\n");
    revert({"a"});
    EXPECT_THAT(interactor_->progress.messages, ElementsAre(u"a wird ausgecheckt"));
}

TEST_F(RevertProgress, NamesAFileThatIsNoUtf8)
{
    const std::string name = "caf\xE9/\xC3\xBC";
    repository_.commitAll(writes(name, "committed\n"), "second");
    repository_.remove(name);
    revert({name});
    EXPECT_THAT(calls(), ElementsAre(0.0, 1.0, message(u"Checking out " + asUtf16(name))));
    EXPECT_EQ(repository_.read(name), "committed\n");
}

TEST_F(RevertProgress, ComesOnTheCallersThread)
{
    std::vector<std::thread::id> threads;
    interactor_->progress.onCall = [&threads](std::size_t)
    { threads.push_back(std::this_thread::get_id()); };
    changeAll();
    revertAll();
    EXPECT_EQ(threads.size(), 7u);
    EXPECT_THAT(threads, Each(std::this_thread::get_id()));
}

TEST_F(RevertProgress, IsInTheLogWithWhatWasNotifiedAndCounted)
{
    changeAll();
    const LogCapture log(git::SeverityProgress | git::SeverityParameter);
    revertAll();
    EXPECT_THAT(log.messages(git::SeverityParameter),
                ElementsAre(" pathStr= completed_steps=0 total_steps=3",
                            " pathStr=a completed_steps=1 total_steps=3",
                            " pathStr=c completed_steps=2 total_steps=3",
                            " pathStr=folder/b completed_steps=3 total_steps=3"));
    // Each as dirty, and as one to be updated.
    EXPECT_THAT(
        log.messages(git::SeverityProgress),
        ElementsAre("Checkout Notify : 2 (a)", "Checkout Notify : 4 (a)", "Checkout Notify : 2 (c)",
                    "Checkout Notify : 4 (c)", "Checkout Notify : 2 (folder/b)",
                    "Checkout Notify : 4 (folder/b)",
                    testing::MatchesRegex("Calls to chmod / mkdir / stat : 0 / 0 / [1-9][0-9]*")));
}

/// The counts of the record at the end of a checkout.
std::string countsIn(const LogCapture &log)
{
    return log.messages(git::SeverityProgress).back();
}

TEST_F(RevertProgress, CountsTheFoldersThatAreMade)
{
    repository_.remove("folder");
    const LogCapture log(git::SeverityProgress);
    revert({"folder/b"});
    EXPECT_THAT(countsIn(log), HasSubstr(" : 0 / 1 / "));
}

TEST_F(RevertProgress, LeavesOtherFilesOut)
{
    repository_.write("other", "changed, and longer\n");
    repository_.write("a", "changed, and longer\n");
    revert({"a"});
    EXPECT_THAT(calls(), ElementsAre(0.0, 1.0, message(u"Checking out a")));
    EXPECT_EQ(repository_.read("other"), "changed, and longer\n");
}

TEST_F(RevertProgress, ThatCannotBeShownChangesNoResult)
{
    changeAll();
    revertAll();
    const auto expected = stateOf(repository_);

    changeAll();
    calls().clear();
    interactor_->progress.onCall = [](std::size_t) { throw std::runtime_error("no display"); };
    const LogCapture log(git::SeverityException | git::SeverityProgress);
    EXPECT_NO_THROW(revertAll());
    // What follows a call that fails in the same step is not made.
    EXPECT_THAT(calls(), ElementsAre(0.0, 1.0 / 3, 2.0 / 3, 1.0));
    EXPECT_THAT(log.messages(git::SeverityException),
                testing::AllOf(testing::SizeIs(4), Each(HasSubstr("no display"))));
    EXPECT_THAT(countsIn(log), HasSubstr("Calls to chmod"));
    EXPECT_EQ(stateOf(repository_), expected);
    EXPECT_EQ(git::pendingCallbackException(), nullptr);
}

TEST_F(RevertProgress, ThatRaisesWhatIsNoExceptionAtOneMessageGoesOn)
{
    changeAll();
    interactor_->progress.onCall = [](std::size_t number)
    {
        if (number == 3)
            throw 42;
    };
    revertAll();
    EXPECT_EQ(calls().size(), 7u);
    EXPECT_EQ(calls().back(), message(u"Checking out folder/b"));
    EXPECT_EQ(repository_.git({"status", "--porcelain"}), "");
    EXPECT_EQ(git::pendingCallbackException(), nullptr);
}

} // namespace
