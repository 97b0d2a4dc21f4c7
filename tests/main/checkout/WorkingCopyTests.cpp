// SPDX-License-Identifier: MIT
#include "main/checkout/WorkingCopy.hpp"

#include <cstddef>
#include <string>
#include <vector>

#include <git2/index.h>
#include <gtest/gtest.h>

#include "ObstacleFixture.hpp"
#include "support/UnprivilegedUser.hpp"
#include "support/text.hpp"
#include "util/repository/repository.hpp"

namespace
{

namespace git = vclink::git;
using namespace vclink::test;

class WorkingCopies : public ObstacleFixture
{
  protected:
    std::string blockerOf(const std::string &name) const
    {
        const auto repository = git::openRepository(asPath(repository_.path()));
        return git::WorkingCopy(repository.get()).wayTo(name).blocker;
    }
    std::string foreignBelow(const std::string &folder) const
    {
        const auto repository = git::openRepository(asPath(repository_.path()));
        return git::WorkingCopy(repository.get()).foreignBelow(folder);
    }
};

/// It goes before the folder comes.
TEST_F(WorkingCopies, LeadThroughAFileOfHeadThatBecomesAFolder)
{
    EXPECT_EQ(blockerOf("file/a"), "");
    repository_.remove("file");
    repository_.symlink("other", "file");
    EXPECT_EQ(blockerOf("file/a"), "");
}

TEST_F(WorkingCopies, DoNotLeadThroughAFifoInThePlaceOfAFileOfHead)
{
    repository_.remove("file");
    makeFifo(repository_ / "file");
    EXPECT_EQ(blockerOf("file/a"), "file");
    EXPECT_EQ(blockerOf("file/deeper/a"), "file");
}

/// The search goes on from the last name, in either direction.
TEST_F(WorkingCopies, FindTheEntriesThatTheIndexHas)
{
    for (int i = 0; i < 40; ++i)
        repository_.write("d/" + std::to_string(i), std::to_string(i));
    repository_.git({"add", "."});
    const std::string id = repository_.line({"rev-parse", "HEAD:file"});
    repository_.command({"update-index", "--index-info"})
        .input("100644 " + id + " 2\td/in-conflict\n")
        .run();
    const std::string listed = repository_.git({"ls-files"});
    std::vector<std::string> names = split(listed);
    names.insert(names.end(), {"", "a", "d", "d/", "d/10a", "d/99", "D/1", "zz"});
    const auto repository = git::openRepository(asPath(repository_.path()));
    const auto index = git::getRepositoryIndex(repository.get());
    git::WorkingCopy copy(repository.get());
    const std::size_t count = names.size();
    for (const std::size_t step : {std::size_t{1}, std::size_t{7}, count - 1, count - 5})
        for (std::size_t i = 0; i < count; ++i)
        {
            const std::string &name = names[i * step % count];
            EXPECT_EQ(copy.entryOf(name), git_index_get_bypath(index.get(), name.c_str(), 0))
                << name << " by steps of " << step;
        }
    EXPECT_EQ(copy.entryOf("d/in-conflict"), nullptr);
    EXPECT_STREQ(copy.entryOf("d/39")->path, "d/39");
}

TEST_F(WorkingCopies, FindEntriesOfAnotherCaseWhereCaseIsIgnored)
{
    for (const auto *name : {"B", "a", "C/one"})
        repository_.write(name, "x");
    repository_.git({"add", "."});
    repository_.git({"config", "core.ignorecase", "true"});
    const auto repository = git::openRepository(asPath(repository_.path()));
    git::WorkingCopy copy(repository.get());
    for (const auto *name : {"A", "b", "c/ONE", "d/f", "D/F", "file", "B", "a"})
        EXPECT_NE(copy.entryOf(name), nullptr) << name;
}

TEST_F(WorkingCopies, KnowWhatHeadDoesNotHaveInAFolder)
{
    EXPECT_EQ(foreignBelow("d"), "");
    repository_.write("d/deeper/mine", "mine\n");
    EXPECT_EQ(foreignBelow("d"), "d/deeper");
}

TEST_F(WorkingCopies, TakeAFolderThatCannotBeReadForForeign)
{
    repository_.setMode("d", 0);
    giveToUnprivilegedUser(repository_.path());
    EXPECT_EQ(runAsUnprivilegedUser([this] { return foreignBelow("d"); }), "d");
    repository_.setMode("d", 0755);
    EXPECT_EQ(runAsUnprivilegedUser([this] { return foreignBelow("d"); }), "");
}

} // namespace
