// SPDX-License-Identifier: MIT
// The path and the mode of a file that a command has merged.
#include <string>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "MergeDriverTest.hpp"

namespace
{

using testing::ElementsAre;
using vclink::test::Scripts;

const char *const attributesEntry = "100644\t0\t.gitattributes";

/// Enough lines for a rename to be found.
std::string content(const std::string &first)
{
    return first + "\n2\n3\n4\n5\n6\n7\n8\n9\n10\n";
}

struct Side
{
    std::string name = "file";
    unsigned mode = 0644;
};

class MergeDriverResult : public vclink::test::MergeDriverTest
{
  protected:
    /// Merges a file that each side has edited, and moved or made executable as told.
    void mergeSides(const Side &ours, const Side &theirs, unsigned baseMode = 0644)
    {
        const auto edit = [this](const Side &side, const std::string &first)
        {
            if (side.name != "file")
                repository_.git({"mv", "file", side.name});
            repository_.write(side.name, content(first));
            repository_.setMode(side.name, side.mode);
        };
        diverge(
            [&]
            {
                repository_.write(".gitattributes", "* merge=tool\n");
                repository_.write("file", content("base"));
                repository_.setMode("file", baseMode);
            },
            [&] { edit(ours, "ours"); }, [&] { edit(theirs, "theirs"); });
        defineScript("tool", "echo \"$5\" >" + path_ + "; echo merged >\"$2\"");
        EXPECT_EQ(merge(), 0);
    }
    std::string pathOfCommand() const
    {
        return Scripts::read(path_);
    }

  private:
    std::string path_ = folder() / "path";
};

TEST_F(MergeDriverResult, HasTheOneNameAndMode)
{
    mergeSides({}, {});
    EXPECT_THAT(index(), ElementsAre(attributesEntry, "100644\t0\tfile"));
    EXPECT_EQ(pathOfCommand(), "file\n");
}

TEST_F(MergeDriverResult, HasTheNameThatTheirsHasGiven)
{
    mergeSides({}, {"new", 0644});
    EXPECT_THAT(index(), ElementsAre(attributesEntry, "100644\t0\tnew"));
    EXPECT_EQ(staged("new"), "merged\n");
    EXPECT_EQ(pathOfCommand(), "new\n");
}

TEST_F(MergeDriverResult, HasTheNameThatOursHasGiven)
{
    mergeSides({"new", 0644}, {});
    EXPECT_THAT(index(), ElementsAre(attributesEntry, "100644\t0\tnew"));
    EXPECT_EQ(pathOfCommand(), "new\n");
}

TEST_F(MergeDriverResult, HasTheModeThatTheirsHasGiven)
{
    mergeSides({}, {"file", 0755});
    EXPECT_THAT(index(), ElementsAre(attributesEntry, "100755\t0\tfile"));
}

TEST_F(MergeDriverResult, HasTheModeThatOursHasGiven)
{
    mergeSides({"file", 0755}, {});
    EXPECT_THAT(index(), ElementsAre(attributesEntry, "100755\t0\tfile"));
}

TEST_F(MergeDriverResult, LosesTheExecutableBitThatOneSideHasTaken)
{
    mergeSides({"file", 0644}, {"file", 0755}, 0755);
    EXPECT_THAT(index(), ElementsAre(attributesEntry, "100644\t0\tfile"));
}

TEST_F(MergeDriverResult, HasTheNameOfOneSideAndTheModeOfTheOther)
{
    mergeSides({"new", 0644}, {"file", 0755});
    EXPECT_THAT(index(), ElementsAre(attributesEntry, "100755\t0\tnew"));
}

TEST_F(MergeDriverResult, HasTheModeOfOursAndTheNameOfTheirs)
{
    mergeSides({"file", 0755}, {"new", 0644});
    EXPECT_THAT(index(), ElementsAre(attributesEntry, "100755\t0\tnew"));
}

TEST_F(MergeDriverResult, IsNotAskedForWhenBothHaveMovedTheFile)
{
    mergeSides({"new", 0644}, {"new", 0644});
    EXPECT_THAT(index(), ElementsAre(attributesEntry, "100644\t1\tfile", "100644\t2\tnew",
                                     "100644\t3\tnew"));
    EXPECT_EQ(pathOfCommand(), "");
}

} // namespace
