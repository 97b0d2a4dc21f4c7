// SPDX-License-Identifier: MIT
#include "util/repository/settings.hpp"

#include <functional>
#include <ostream>
#include <string>
#include <vector>

#include <git2/errors.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "main/merge/MergeFixture.hpp"
#include "support/WithoutLeakChecks.hpp"
#include "support/text.hpp"

namespace
{

using testing::HasSubstr;
using namespace vclink::test;

struct AccessCase
{
    const char *sentence;
    /// in the section [core]
    const char *line;
    /// a part of the refusal
    const char *refusal = "";
    bool isRefusedByGit = false;
};

void PrintTo(const AccessCase &row, std::ostream *stream)
{
    *stream << row.line;
}

const std::string binaryText("a\0\nb\r\n", 6);

/// Settings with which libgit2 would convert binary files, too, or fail halfway.
class UnreadableSettings : public MergeFixture, public testing::WithParamInterface<AccessCase>
{
  protected:
    UnreadableSettings()
    {
        repository_.commitAll(
            writes(".gitattributes", "*.bin binary\n") + writes("p.bin", binaryText), "binary");
        makeBranch("ahead", writes("q.bin", binaryText));
        diverge(writes("ours", "x"), writes("r.bin", binaryText));
        repository_.git({"branch", "old", "main~"});
        config_ = repository_.read(".git/config");
    }

    void set() const
    {
        repository_.write(".git/config",
                          config_ + "[core]\n\t" + std::string(GetParam().line) + '\n');
    }
    /// So that git can be asked again.
    void unset() const
    {
        repository_.write(".git/config", config_);
    }
    static std::vector<upath> namesIn(const GitRepository &repository,
                                      const std::vector<std::string> &names)
    {
        std::vector<upath> paths;
        for (const std::string &name : names)
            paths.push_back(asPath(repository / name));
        return paths;
    }
    void add(const std::vector<std::string> &names) const
    {
        adapter_->addFiles(namesIn(repository_, names));
    }
    void commit() const
    {
        adapter_->commit(asPath(repository_.path()), u"message");
    }
    /// Expects that the operation changes nothing, and says why.
    void expectRefused(const std::function<std::string()> &action) const
    {
        const NothingChanges nothing(repository_);
        set();
        const std::string text = action();
        unset();
        EXPECT_THAT(text, HasSubstr(GetParam().refusal));
    }
    void expectFails(const std::function<void()> &action) const
    {
        expectRefused(
            [&]
            {
                const Failure failure = failureOf(action);
                EXPECT_EQ(failure.code, GIT_ERROR);
                EXPECT_EQ(failure.errorClass, GIT_ERROR_CONFIG);
                return failure.text;
            });
    }

  private:
    std::string config_;
};

TEST_P(UnreadableSettings, StopOperationsThatConvertFiles)
{
    set();
    EXPECT_EQ(repository_.tryGit({"status"}).succeeded(), !GetParam().isRefusedByGit);
    unset();
    repository_.write("new.bin", binaryText);
    repository_.write("p.bin", "edited\n");
    expectFails([this] { add({"new.bin"}); });
    expectFails([this] { adapter_->markResolved(asPath(repository_ / "p.bin")); });
    expectFails([this] { adapter_->revertFiles(namesIn(repository_, {"p.bin"})); });
    expectFails([this] { commit(); });
}

TEST_P(UnreadableSettings, StopSwitchesFastForwardsAndMerges)
{
    expectFails([this] { branches().switchBranch("ahead"); });
    expectRefused([this] { return failureOfMerge("topic"); });
    repository_.git({"switch", "--quiet", "old"});
    expectRefused([this] { return failureOfMerge("ahead"); });
}

TEST_P(UnreadableSettings, LeaveStatesAndRemovalsAlone)
{
    set();
    // libgit2 loses some if it cannot read core.safecrlf.
    const WithoutLeakChecks without;
    EXPECT_NO_THROW(adapter_->getFolderStates(adapter_->getRootFolder()));
    EXPECT_NO_THROW(adapter_->removeFiles(namesIn(repository_, {"other"})));
}

const AccessCase unreadable[] = {
    {"Eol", "eol = auto", "core.eol is 'auto', which libgit2 cannot read: set it to lf, crlf"},
    {"TrueEol", "eol = true", "core.eol is 'true'"},
    {"InputEol", "eol = input", "core.eol is 'input'"},
    {"EolWithoutValue", "eol", "core.eol is ''"},
    {"Autocrlf", "autocrlf = yess", "set it to true, false or input", true},
    {"Safecrlf", "safecrlf = fail", "set it to true, false or warn", true},
    {"LogAllRefUpdates", "logAllRefUpdates = bogus",
     "core.logAllRefUpdates is 'bogus', which libgit2 cannot read: set it to true, false or always",
     true},
};

INSTANTIATE_TEST_SUITE_P(With, UnreadableSettings, testing::ValuesIn(unreadable),
                         [](const auto &row) { return row.param.sentence; });

class ReadableSettings : public UnreadableSettings
{
};

/// git's twin stores the same.
TEST_P(ReadableSettings, StopNothing)
{
    set();
    repository_.write("new.bin", binaryText);
    repository_.write("new", "one\ntwo\n");
    const auto twin = makeTwin();
    twin.git({"add", "."});
    add({"new.bin", "new"});
    EXPECT_EQ(indexOf(repository_), indexOf(twin));
    commit();
    branches().switchBranch("old");
    merge("ahead");
    merge("topic");
    EXPECT_EQ(repository_.read("q.bin"), binaryText);
    EXPECT_EQ(repository_.git({"show", "HEAD:r.bin"}), binaryText);
}

const AccessCase readable[] = {
    {"NoEol", "eol = false"},
    {"UpperCaseEol", "eol = CRLF"},
    {"NativeEol", "eol = native"},
    {"AutocrlfWithoutValue", "autocrlf"},
    {"AutocrlfNumber", "autocrlf = 0"},
    {"InputAutocrlf", "autocrlf = input"},
    {"Warning", "safecrlf = warn"},
    {"NoReflogs", "logAllRefUpdates = false"},
    {"AllReflogs", "logAllRefUpdates = always"},
};

INSTANTIATE_TEST_SUITE_P(With, ReadableSettings, testing::ValuesIn(readable),
                         [](const auto &row) { return row.param.sentence; });

} // namespace
