// SPDX-License-Identifier: MIT
#include <chrono>
#include <filesystem>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "main/AdapterFixture.hpp"
#include "support/text.hpp"

namespace
{

namespace fs = std::filesystem;
using vclink::test::asPath;
using vclink::test::States;

/// The states of single files, of a tree with one committed file.
class FileStates : public vclink::test::AdapterFixture
{
  protected:
    FileStates()
    {
        repository_.write("file", "content\n");
        repository_.write("other", "more\n");
        repository_.commitAll("first");
    }

    void expectState(const std::string &name, const std::string &state) const
    {
        const States expected = state.empty() ? States() : States{{name, state}};
        EXPECT_EQ(states(repository_, {name}), expected) << name << " in a list";
        States inTheTree = allStates(repository_);
        EXPECT_EQ(inTheTree[name], state) << name << " in the tree";
    }

    vclink::test::GitRepository repository_ = makeRepository();
};

TEST_F(FileStates, OfAnUnchangedFileIsClean)
{
    expectState("file", "Clean");
}

TEST_F(FileStates, OfAFileThatOnlyLooksChangedIsClean)
{
    fs::last_write_time(repository_ / "file",
                        fs::file_time_type::clock::now() - std::chrono::hours(24 * 365));
    expectState("file", "Clean");
}

TEST_F(FileStates, OfAnEditedFileIsModified)
{
    repository_.write("file", "edited\n");
    expectState("file", "Modified");
}

TEST_F(FileStates, OfAnEditedFileOfTheSameLengthIsModified)
{
    repository_.write("file", "CONTENT\n");
    expectState("file", "Modified");
}

TEST_F(FileStates, OfAStagedEditIsModified)
{
    repository_.write("file", "edited\n");
    repository_.add({"file"});
    expectState("file", "Modified");
}

TEST_F(FileStates, OfAStagedEditThatWasTakenBackIsModified)
{
    repository_.write("file", "edited\n");
    repository_.add({"file"});
    repository_.write("file", "content\n");
    expectState("file", "Modified");
}

TEST_F(FileStates, OfAStagedEditThatIsGoneFromDiskIsModified)
{
    repository_.write("file", "edited\n");
    repository_.add({"file"});
    repository_.remove("file");
    expectState("file", "Modified");
}

TEST_F(FileStates, OfANewStagedFileIsAdded)
{
    repository_.write("new", "x");
    repository_.add({"new"});
    expectState("new", "Added");
}

TEST_F(FileStates, OfANewStagedFileEditedSinceIsAdded)
{
    repository_.write("new", "x");
    repository_.add({"new"});
    repository_.write("new", "edited since");
    expectState("new", "Added");
}

TEST_F(FileStates, OfANewStagedFileGoneSinceIsAdded)
{
    repository_.write("new", "x");
    repository_.add({"new"});
    repository_.remove("new");
    expectState("new", "Added");
}

TEST_F(FileStates, OfAFileAddedByIntentIsAdded)
{
    repository_.write("new", "x");
    repository_.git({"add", "--intent-to-add", "new"});
    expectState("new", "Added");
}

TEST_F(FileStates, OfAFileRemovedFromTheIndexIsDeleted)
{
    repository_.git({"rm", "--quiet", "file"});
    expectState("file", "Deleted");
}

TEST_F(FileStates, OfAFileRemovedFromTheIndexButStillOnDiskIsDeleted)
{
    repository_.git({"rm", "--quiet", "--cached", "file"});
    expectState("file", "Deleted");
}

TEST_F(FileStates, OfAFileGoneFromDiskIsMissing)
{
    repository_.remove("file");
    expectState("file", "Missing");
}

TEST_F(FileStates, OfAnUntrackedFileIsUnversioned)
{
    repository_.write("new", "x");
    expectState("new", "Unversioned");
}

TEST_F(FileStates, OfAnIgnoredFileIsNone)
{
    repository_.write(".gitignore", "*.o\n");
    repository_.write("a.o", "x");
    expectState("a.o", "");
    EXPECT_EQ(states(repository_, {"a.o", "file"}), (States{{"file", "Clean"}}));
}

TEST_F(FileStates, OfATrackedFileThatIsIgnoredTooIsTheTrackedOne)
{
    repository_.write(".gitignore", "file\n");
    expectState("file", "Clean");
    repository_.write("file", "edited\n");
    expectState("file", "Modified");
}

TEST_F(FileStates, OfANameThatMatchesNothingIsNone)
{
    expectState("nothing", "");
    expectState("file/below", "");
    EXPECT_EQ(states(repository_, {"nothing", "other"}), (States{{"other", "Clean"}}));
}

/// libgit2 tells one path, the old one, and nothing but the renaming.
TEST_F(FileStates, OfAStagedRenamingIsUnknownUnderOnePath)
{
    repository_.write("long", std::string(1000, 'x') + "\n");
    repository_.commitAll("second");
    repository_.git({"mv", "long", "renamed"});
    const States all = allStates(repository_);
    EXPECT_EQ(all, (States{{"file", "Clean"}, {"other", "Clean"}, {"long", "Unknown"}}));
}

/// Seen one by one the two sides are what they are in the index.
TEST_F(FileStates, OfARenamingOfWhichOneSideIsAskedForIsDeletedAndAdded)
{
    repository_.git({"mv", "file", "renamed"});
    EXPECT_EQ(states(repository_, {"file"}), (States{{"file", "Deleted"}}));
    EXPECT_EQ(states(repository_, {"renamed"}), (States{{"renamed", "Added"}}));
}

TEST_F(FileStates, OfARenamingThatIsNotStagedAreTwo)
{
    fs::rename(repository_ / "file", repository_ / "renamed");
    EXPECT_EQ(allStates(repository_),
              (States{{"file", "Missing"}, {"other", "Clean"}, {"renamed", "Unversioned"}}));
}

TEST_F(FileStates, OfAFileThatBecameALinkIsUnknown)
{
    repository_.remove("file");
    repository_.symlink("nowhere", "file");
    // In a list of names a link stands for its target, a dangling one for itself.
    EXPECT_EQ(allStates(repository_).at("file"), "Unknown");
    repository_.add({"file"});
    EXPECT_EQ(allStates(repository_).at("file"), "Unknown");
    EXPECT_EQ(states(repository_, {"file"}), (States{{"file", "Unknown"}}));
}

TEST_F(FileStates, OfAChangedExecutableBitIsModified)
{
    repository_.setMode("file", 0755);
    expectState("file", "Modified");
    repository_.add({"file"});
    expectState("file", "Modified");
}

TEST_F(FileStates, OfAnExecutableBitThatDoesNotCountIsClean)
{
    repository_.git({"config", "core.fileMode", "false"});
    repository_.setMode("file", 0755);
    expectState("file", "Clean");
}

TEST_F(FileStates, OfAFileThatBecameAFolderAreMissingAndUnversioned)
{
    repository_.remove("file");
    repository_.write("file/inside", "x");
    const States all = allStates(repository_);
    EXPECT_EQ(all.at("file/inside"), "Unversioned");
    EXPECT_EQ(all.at("file"), "Missing");
}

/// As git has it: the changed length is enough until the file is staged, which changes nothing.
TEST_F(FileStates, OfALineEndThatGitConvertsIsCleanOnceItIsStaged)
{
    repository_.write(".gitattributes", "file text eol=crlf\n");
    repository_.commitAll("second");
    repository_.write("file", "content\r\n");
    expectState("file", "Modified");
    ASSERT_EQ(repository_.git({"status", "--porcelain"}), " M file\n");
    repository_.add({"file"});
    ASSERT_EQ(repository_.git({"status", "--porcelain"}), "");
    expectState("file", "Clean");
}

TEST_F(FileStates, OfSeveralFilesComeFromOneCall)
{
    repository_.write("other", "edited\n");
    repository_.write("new", "x");
    repository_.write("sub/deep/new", "x");
    EXPECT_EQ(states(repository_, {"sub/deep/new", "other", "file", "nothing"}),
              (States{{"file", "Clean"}, {"other", "Modified"}, {"sub/deep/new", "Unversioned"}}));
}

TEST_F(FileStates, OfAFolderInAListAreThoseBelowIt)
{
    repository_.write("sub/deep/new", "x");
    repository_.write("subway", "x");
    EXPECT_EQ(states(repository_, {"sub", "file"}),
              (States{{"file", "Clean"}, {"sub/deep/new", "Unversioned"}}));
}

TEST_F(FileStates, OfAFileNamedTwiceComeOnce)
{
    EXPECT_EQ(states(repository_, {"file", "./file", "sub/../file"}), (States{{"file", "Clean"}}));
}

TEST_F(FileStates, OfAnEmptyListAreNone)
{
    EXPECT_EQ(states(repository_, {}), States());
}

TEST_F(FileStates, OfAnEmptyListAreNoneWithoutARepository)
{
    EXPECT_TRUE(makeAdapter(folder() / "missing")->getFileStates({}).empty());
    EXPECT_TRUE(makeAdapter("")->getFileStates({}).empty());
}

TEST_F(FileStates, OfNamesWithWildcardCharactersAreThoseOfThePattern)
{
    for (const auto *name : {"a[1].txt", "a1.txt", "b.txt"})
        repository_.write(name, "x");
    EXPECT_EQ(states(repository_, {"a[1].txt"}),
              (States{{"a1.txt", "Unversioned"}, {"a[1].txt", "Unversioned"}}));
    EXPECT_EQ(states(repository_, {"*.txt"}).size(), 3U);
}

TEST_F(FileStates, OfNamesThatBeginDangerouslyAreThoseOfTheFiles)
{
    for (const auto *name : {"#a", "!b", "a", "b"})
        repository_.write(name, "x");
    EXPECT_EQ(states(repository_, {"#a"}), (States{{"#a", "Unversioned"}}));
    EXPECT_EQ(states(repository_, {"#a", "!b"}),
              (States{{"#a", "Unversioned"}, {"!b", "Unversioned"}}));
}

TEST_F(FileStates, OfAPathThatWouldMeanEverythingAreNone)
{
    const auto adapter = makeAdapter(repository_.path());
    EXPECT_TRUE(adapter->getFileStates({upath()}).empty());
    EXPECT_TRUE(adapter->getFileStates({asPath(repository_.path())}).empty());
    EXPECT_TRUE(adapter->getFileStates({asPath("missing/relative")}).empty());
}

TEST_F(FileStates, AreReadAfreshEachTime)
{
    const auto adapter = makeAdapter(repository_.path());
    const std::vector<upath> files{asPath(repository_ / "file")};
    const auto state = [&]
    { return vclink::test::nameOf(adapter->getFileStates(files).begin()->second); };
    EXPECT_EQ(state(), "Clean");
    repository_.write("file", "edited\n");
    EXPECT_EQ(state(), "Modified");
    repository_.git({"rm", "--quiet", "--cached", "file"});
    EXPECT_EQ(state(), "Deleted");
    repository_.git({"reset", "--quiet", "--hard"});
    EXPECT_EQ(state(), "Clean");
    fs::remove_all(repository_ / ".git");
    EXPECT_ANY_THROW(adapter->getFileStates(files));
}

} // namespace
