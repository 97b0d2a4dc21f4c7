// SPDX-License-Identifier: MIT
#include <string>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "MergeFixture.hpp"
#include "support/text.hpp"

namespace
{

using testing::ElementsAre;
using testing::IsEmpty;
using namespace vclink::test;

/// Conflicts resolved by the host's own operations.
class MergeConflictsResolved : public MergeFixture
{
  protected:
    MergeConflictsResolved()
    {
        repository_.commitAll(writes(".gitattributes", "binary -merge\n") +
                                  writes("binary", "ancestor\n"),
                              "attributes");
        diverge(writes("file", "ours\n") + writes("binary", "ours\n") + removes("other"),
                writes("file", "theirs\n") + writes("binary", "theirs\n") +
                    writes("other", "theirs\n") + writes("new", "x"));
        expectConflicts("topic");
    }
    void markResolved(const std::string &name) const
    {
        adapter_->markResolved(asPath(repository_ / name));
    }
};

TEST_F(MergeConflictsResolved, AreCommittedWithBothParentsAndLetTheNextMergeBegin)
{
    const std::string ours = idOf("HEAD");
    repository_.write("file", "both\n");
    repository_.write("binary", "theirs\n");
    repository_.remove("other");
    for (const auto *name : {"file", "binary", "other"})
        markResolved(name);
    EXPECT_THAT(conflicts(), IsEmpty());
    EXPECT_EQ(branches().getRepositoryState(), "Conflicts");
    adapter_->commit(upath(), u"by hand");
    EXPECT_EQ(branches().getRepositoryState(), "Normal");
    EXPECT_THAT(parents(), ElementsAre(ours, idOf("topic")));
    EXPECT_EQ(message(), "by hand");
    EXPECT_THAT(status(), IsEmpty());
    EXPECT_EQ(repository_.git({"ls-tree", "-r", "--name-only", "HEAD"}),
              ".gitattributes\nbinary\nfile\nnew\n");
    EXPECT_EQ(repository_.git({"cat-file", "blob", "HEAD:file"}), "both\n");
    EXPECT_EQ(repository_.git({"fsck", "--strict", "--no-dangling"}), "");
    makeBranch("second", writes("second", "x"));
    EXPECT_NO_THROW(merge("second"));
    EXPECT_NO_THROW(merge("topic")) << "up to date";
}

TEST_F(MergeConflictsResolved, AreStatesThatTheAdapterTells)
{
    auto states = allStates(repository_);
    for (const auto *name : {"file", "binary", "other"})
        EXPECT_EQ(states[name], "InConflict") << name;
    EXPECT_EQ(states["new"], "Added");
    markResolved("file");
    EXPECT_NE(allStates(repository_)["file"], "InConflict");
}

} // namespace
