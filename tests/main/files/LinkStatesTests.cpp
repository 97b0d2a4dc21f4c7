// SPDX-License-Identifier: MIT

#include <boost/filesystem/exception.hpp>
#include <gtest/gtest.h>

#include "main/AdapterFixture.hpp"
#include "support/text.hpp"

namespace
{

using namespace vclink::test;

/// Symbolic links in a working copy.
class LinkStates : public AdapterFixture
{
  protected:
    LinkStates()
    {
        repository_.write("file", "x");
        repository_.write("sub/inside", "x");
        repository_.symlink("file", "tofile");
        repository_.symlink("sub", "tofolder");
        repository_.symlink("nowhere", "dangling");
        repository_.commitAll("first");
    }

    GitRepository repository_ = makeRepository();
};

TEST_F(LinkStates, AreThoseOfTheLinksInAFolder)
{
    EXPECT_EQ(allStates(repository_), (States{{"file", "Clean"},
                                              {"sub/inside", "Clean"},
                                              {"tofile", "Clean"},
                                              {"tofolder", "Clean"},
                                              {"dangling", "Clean"}}));
}

TEST_F(LinkStates, OfAChangedTargetIsModified)
{
    repository_.remove("tofile");
    repository_.symlink("sub/inside", "tofile");
    EXPECT_EQ(allStates(repository_).at("tofile"), "Modified");
}

TEST_F(LinkStates, OfANewLinkIsUnversionedAndNotFollowed)
{
    repository_.symlink("../home", "new");
    EXPECT_EQ(allStates(repository_).at("new"), "Unversioned");
    EXPECT_EQ(allStates(repository_).size(), 6U);
}

TEST_F(LinkStates, OfALinkInAListAreThoseOfItsTarget)
{
    EXPECT_EQ(states(repository_, {"tofile"}), (States{{"file", "Clean"}}));
    EXPECT_EQ(states(repository_, {"tofolder/inside"}), (States{{"sub/inside", "Clean"}}));
}

TEST_F(LinkStates, OfADanglingLinkInAListIsItsOwn)
{
    EXPECT_EQ(states(repository_, {"dangling"}), (States{{"dangling", "Clean"}}));
    repository_.remove("dangling");
    EXPECT_EQ(states(repository_, {"dangling"}), (States{{"dangling", "Missing"}}));
}

TEST_F(LinkStates, OfAFolderReachedThroughALinkAreThoseOfTheFolder)
{
    EXPECT_EQ(folderStates(repository_, "tofolder"), (States{{"sub/inside", "Clean"}}));
}

TEST_F(LinkStates, RaiseOnALoop)
{
    repository_.symlink("loop", "loop");
    EXPECT_THROW(states(repository_, {"file", "loop"}), boost::filesystem::filesystem_error);
    EXPECT_THROW(folderStates(repository_, "loop"), boost::filesystem::filesystem_error);
    EXPECT_EQ(allStates(repository_).at("loop"), "Unversioned");
}

/// The path is looked at before the repository.
TEST_F(LinkStates, RaiseOnALoopEvenWithoutARepository)
{
    repository_.symlink("loop", "../loop");
    const auto adapter = makeAdapter(environment().home());
    EXPECT_THROW(adapter->getFileStates({asPath(folder() / "loop")}),
                 boost::filesystem::filesystem_error);
    EXPECT_THROW(adapter->getFolderStates(asPath(folder() / "loop")),
                 boost::filesystem::filesystem_error);
    EXPECT_THROW(makeAdapter(folder() / "loop")->getFolderStates(upath()),
                 boost::filesystem::filesystem_error);
}

} // namespace
