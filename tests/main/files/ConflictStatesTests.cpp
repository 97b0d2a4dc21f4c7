// SPDX-License-Identifier: MIT
#include <optional>
#include <string>

#include <gtest/gtest.h>

#include "main/AdapterFixture.hpp"
#include "support/Sentence.hpp"

namespace
{

using namespace vclink::test;

/// A merge of two branches that changed one file each in its way.
class ConflictStates : public AdapterFixture
{
  protected:
    using Content = std::optional<std::string>;

    void commit(const Content &content)
    {
        if (content)
            repository_.write("file", *content);
        else
            repository_.remove("file");
        repository_.commitAll("change");
    }

    /// @return git's two letters for the file
    std::string merge(const Content &base, const Content &ours, const Content &theirs)
    {
        repository_.commitAll(writes("bystander", "x"), "beginning");
        if (base)
            commit(base);
        repository_.git({"branch", "other"});
        commit(ours);
        repository_.git({"checkout", "--quiet", "other"});
        commit(theirs);
        repository_.git({"checkout", "--quiet", "main"});
        repository_.tryGit(
            {"-c", "user.name=T", "-c", "user.email=t@example.com", "merge", "--quiet", "other"});
        return repository_.git({"status", "--porcelain", "file"}).substr(0, 2);
    }

    void expectConflict() const
    {
        const States expected{{"bystander", "Clean"}, {"file", "InConflict"}};
        EXPECT_EQ(allStates(repository_), expected);
        EXPECT_EQ(states(repository_, {"file"}), (States{{"file", "InConflict"}}));
    }

    GitRepository repository_ = makeRepository();
};

struct ConflictRow : Sentence
{
    std::optional<std::string> base;
    std::optional<std::string> ours;
    std::optional<std::string> theirs;
    std::string letters;
};

class EachConflict : public ConflictStates, public testing::WithParamInterface<ConflictRow>
{
};

TEST_P(EachConflict, IsInConflict)
{
    ASSERT_EQ(merge(GetParam().base, GetParam().ours, GetParam().theirs), GetParam().letters);
    expectConflict();
}

const ConflictRow conflictRows[]{
    {{"BothChanged"}, "base\n", "ours\n", "theirs\n", "UU"},
    {{"BothAdded"}, {}, "ours\n", "theirs\n", "AA"},
    {{"TheyDeleted"}, "base\n", "ours\n", {}, "UD"},
    {{"WeDeleted"}, "base\n", {}, "theirs\n", "DU"},
};

INSTANTIATE_TEST_SUITE_P(OfAFileThat, EachConflict, testing::ValuesIn(conflictRows),
                         testing::PrintToStringParamName());

TEST_F(ConflictStates, StandsWhateverIsOnDiskUntilTheFileIsStaged)
{
    ASSERT_EQ(merge("base\n", "ours\n", "theirs\n"), "UU");
    repository_.remove("file");
    expectConflict();
    repository_.write("file", "ours\n");
    expectConflict();
    repository_.write("file", "merged\n");
    repository_.add({"file"});
    EXPECT_EQ(states(repository_, {"file"}), (States{{"file", "Modified"}}));
}

/// The three stages of a renaming on both sides, of which each path has one only.
TEST_F(ConflictStates, OfAFileThatBothRenamed)
{
    repository_.commitAll(writes("file", std::string(1000, 'x') + "\n"), "base");
    repository_.git({"branch", "other"});
    repository_.git({"mv", "file", "ours"});
    repository_.commit("ours");
    repository_.git({"checkout", "--quiet", "other"});
    repository_.git({"mv", "file", "theirs"});
    repository_.commit("theirs");
    repository_.git({"checkout", "--quiet", "main"});
    repository_.tryGit(
        {"-c", "user.name=T", "-c", "user.email=t@example.com", "merge", "--quiet", "other"});
    ASSERT_EQ(repository_.git({"status", "--porcelain"}), "DD file\nAU ours\nUA theirs\n");
    EXPECT_EQ(allStates(repository_),
              (States{{"file", "InConflict"}, {"ours", "InConflict"}, {"theirs", "InConflict"}}));
}

} // namespace
