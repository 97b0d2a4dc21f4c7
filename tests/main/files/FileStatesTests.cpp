// SPDX-License-Identifier: MIT
#include <filesystem>
#include <ostream>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "main/AdapterFixture.hpp"
#include "runScript.hpp"
#include "support/text.hpp"

namespace
{

namespace fs = std::filesystem;
using namespace vclink::test;

/// The states of single files, of a tree with one committed file.
class FileStates : public AdapterFixture
{
  protected:
    FileStates()
    {
        repository_.commitAll(writes("file", "content\n") + writes("other", "more\n"), "first");
    }

    void expectState(const std::string &name, const std::string &state) const
    {
        const States expected = state.empty() ? States() : States{{name, state}};
        EXPECT_EQ(states(repository_, {name}), expected) << name << " in a list";
        States inTheTree = allStates(repository_);
        EXPECT_EQ(inTheTree[name], state) << name << " in the tree";
    }

    GitRepository repository_ = makeRepository();
};

/// What is done in a script of the shell, and the state of a file then, in a list and in the tree.
struct StateCase
{
    const char *sentence;
    const char *script;
    const char *name;
    const char *state;
};

void PrintTo(const StateCase &row, std::ostream *stream)
{
    *stream << row.script;
}

class StateOf : public FileStates, public testing::WithParamInterface<StateCase>
{
};

TEST_P(StateOf, Is)
{
    runScript(repository_, GetParam().script);
    expectState(GetParam().name, GetParam().state);
}

const StateCase stateCases[] = {
    {"AnUnchangedFile", ":", "file", "Clean"},
    {"AFileThatOnlyLooksChanged", "touch -d '1 year ago' file", "file", "Clean"},
    {"AnEditedFile", "echo edited >file", "file", "Modified"},
    {"AnEditedFileOfTheSameLength", "echo CONTENT >file", "file", "Modified"},
    {"AStagedEdit", "echo edited >file; git add file", "file", "Modified"},
    {"AStagedEditThatWasTakenBack", "echo edited >file; git add file; echo content >file", "file",
     "Modified"},
    {"AStagedEditThatIsGoneFromDisk", "echo edited >file; git add file; rm file", "file",
     "Modified"},
    {"ANewStagedFile", "echo x >new; git add new", "new", "Added"},
    {"ANewStagedFileEditedSince", "echo x >new; git add new; echo edited >new", "new", "Added"},
    {"ANewStagedFileGoneSince", "echo x >new; git add new; rm new", "new", "Added"},
    {"AFileAddedByIntent", "echo x >new; git add --intent-to-add new", "new", "Added"},
    {"AFileRemovedFromTheIndex", "git rm --quiet file", "file", "Deleted"},
    {"AFileRemovedFromTheIndexButStillOnDisk", "git rm --quiet --cached file", "file", "Deleted"},
    {"AFileGoneFromDisk", "rm file", "file", "Missing"},
    {"AnUntrackedFile", "echo x >new", "new", "Unversioned"},
    {"AnIgnoredFile", "echo '*.o' >.gitignore; echo x >a.o", "a.o", ""},
    {"ATrackedFileThatIsIgnoredToo", "echo file >.gitignore", "file", "Clean"},
    {"AnEditedFileThatIsIgnoredToo", "echo file >.gitignore; echo edited >file", "file",
     "Modified"},
    {"ANameThatMatchesNothing", ":", "nothing", ""},
    {"ANameBelowAFile", ":", "file/below", ""},
    {"AChangedExecutableBit", "chmod 755 file", "file", "Modified"},
    {"AStagedExecutableBit", "chmod 755 file; git add file", "file", "Modified"},
    {"AnExecutableBitThatDoesNotCount", "git config core.fileMode false; chmod 755 file", "file",
     "Clean"},
};

INSTANTIATE_TEST_SUITE_P(TheFile, StateOf, testing::ValuesIn(stateCases),
                         [](const auto &row) { return row.param.sentence; });

/// libgit2 reports only the renaming, with the old path.
TEST_F(FileStates, OfAStagedRenamingIsUnknownUnderOnePath)
{
    repository_.commitAll(writes("long", std::string(1000, 'x') + "\n"), "second");
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
    // In a list of names a link means its target, or itself if the target does not exist.
    EXPECT_EQ(allStates(repository_).at("file"), "Unknown");
    repository_.add({"file"});
    EXPECT_EQ(allStates(repository_).at("file"), "Unknown");
    EXPECT_EQ(states(repository_, {"file"}), (States{{"file", "Unknown"}}));
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
    repository_.commitAll(writes(".gitattributes", "file text eol=crlf\n"), "second");
    repository_.write("file", "content\r\n");
    expectState("file", "Modified");
    ASSERT_EQ(repository_.git({"status", "--porcelain"}), " M file\n");
    repository_.add({"file"});
    ASSERT_EQ(repository_.git({"status", "--porcelain"}), "");
    expectState("file", "Clean");
}

TEST_F(FileStates, OfSeveralFilesAndFoldersComeFromOneCall)
{
    repository_.write(".gitignore", "*.o\n");
    for (const auto *name : {"a.o", "new", "sub/deep/new", "subway"})
        repository_.write(name, "x");
    repository_.write("other", "edited\n");
    EXPECT_EQ(states(repository_, {"sub/deep/new", "other", "file", "nothing", "a.o"}),
              (States{{"file", "Clean"}, {"other", "Modified"}, {"sub/deep/new", "Unversioned"}}));
    EXPECT_EQ(states(repository_, {"sub", "file"}),
              (States{{"file", "Clean"}, {"sub/deep/new", "Unversioned"}}));
    EXPECT_EQ(states(repository_, {"file", "./file", "sub/../file"}), (States{{"file", "Clean"}}));
}

TEST_F(FileStates, OfAnEmptyListAreNoneAlsoWithoutARepository)
{
    EXPECT_EQ(states(repository_, {}), States());
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
    const auto state = [&] { return nameOf(adapter->getFileStates(files).begin()->second); };
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
