// SPDX-License-Identifier: MIT
#include <filesystem>
#include <fstream>
#include <iterator>
#include <map>
#include <stdexcept>
#include <string>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "support/GitFixture.hpp"

namespace
{

namespace fs = std::filesystem;
using testing::HasSubstr;
using vclink::test::GitRepository;

/// Mode and bytes of each file, and each folder's mode.
std::map<std::string, std::string> filesBelow(const fs::path &folder)
{
    std::map<std::string, std::string> files;
    for (const auto &entry : fs::recursive_directory_iterator(folder))
    {
        std::string &text = files[entry.path().lexically_relative(folder)];
        text = std::to_string(static_cast<unsigned>(entry.status().permissions()));
        std::ifstream stream(entry.path(), std::ios::binary);
        if (entry.is_regular_file())
            text.append(std::istreambuf_iterator<char>(stream), {});
    }
    return files;
}

using GitRepositoryTest = vclink::test::GitFixture;

TEST_F(GitRepositoryTest, BeginsAsGitInitMakesItAndNotOverAnother)
{
    const auto repository = makeRepository();
    EXPECT_EQ(repository.path(), folder() / "repository");
    const auto made = folder() / "made";
    repository.git({"init", "--quiet", "--template=", "--initial-branch=main", made.string()});
    EXPECT_EQ(filesBelow(repository.path()), filesBelow(made));
    EXPECT_THROW(makeRepository(), std::runtime_error);
}

TEST_F(GitRepositoryTest, WritesFilesOfAnyNameAndContent)
{
    const auto repository = makeRepository();
    const std::string bytes("a\0b\r\n\xff", 6);
    repository.write("deep/down/\xff \"x\"\n", bytes);
    EXPECT_EQ(repository.read("deep/down/\xff \"x\"\n"), bytes);
    EXPECT_EQ(repository.git({"ls-files", "-z", "--others"}),
              std::string("deep/down/\xff \"x\"\n") + '\0');
}

TEST_F(GitRepositoryTest, MakesRemovesLinksAndSetsModes)
{
    const auto repository = makeRepository();
    repository.makeFolder("a/b");
    repository.symlink("nowhere", "c/link");
    repository.write("tool", "x");
    repository.setMode("tool", 0755);
    EXPECT_TRUE(fs::is_directory(repository / "a/b"));
    EXPECT_EQ(fs::read_symlink(repository / "c/link"), "nowhere");
    EXPECT_EQ(fs::status(repository / "tool").permissions(), fs::perms(0755));
    repository.remove("a");
    EXPECT_FALSE(fs::exists(repository / "a"));
    EXPECT_THROW(repository.remove("a"), std::runtime_error);
}

TEST_F(GitRepositoryTest, StagesNamesAsTheyAreAndNotAsPatternsAndRemovals)
{
    auto repository = makeRepository();
    for (const auto *name : {"a1", "a[1]", "#x", "!y"})
        repository.write(name, "x");
    repository.add({"a[1]", "#x"});
    EXPECT_EQ(repository.git({"ls-files"}), "#x\na[1]\n");
    repository.add();
    EXPECT_EQ(repository.git({"ls-files"}), "!y\n#x\na1\na[1]\n");
    repository.commit("first");
    repository.remove("a1");
    repository.add({"a1"});
    EXPECT_EQ(repository.git({"status", "--porcelain"}), "D  a1\n");
}

TEST_F(GitRepositoryTest, CommitsTheSameIdsEveryTimeWithoutLeavingAnIdentityAndClones)
{
    auto one = makeRepository("one");
    auto two = makeRepository("two");
    for (auto *repository : {&one, &two})
        repository->write("file", "text");
    const auto id = one.commitAll("first");
    EXPECT_EQ(id.size(), 40u);
    EXPECT_EQ(two.commitAll("first"), id);
    EXPECT_NE(one.commit("second"), id);
    EXPECT_EQ(two.line({"log", "--format=%an <%ae>"}), "Test Author <author@example.com>");
    EXPECT_FALSE(two.tryGit({"config", "user.name"}).succeeded());
    const auto copy = GitRepository::clone(two.path(), folder() / "copy");
    EXPECT_EQ(copy.read("file"), "text");
    EXPECT_EQ(copy.line({"rev-parse", "HEAD"}), id);
}

TEST_F(GitRepositoryTest, TellsTheIdOfACommitOnABranchOnNoneAndInALinkedWorkingCopy)
{
    const auto expectIdOfHead = [](GitRepository repository)
    {
        const auto id = repository.commit("message");
        EXPECT_EQ(id, repository.line({"rev-parse", "HEAD"}));
    };
    auto repository = makeRepository();
    expectIdOfHead(repository);
    repository.git({"pack-refs", "--all"});
    repository.git({"checkout", "--quiet", "-b", "a/branch"});
    expectIdOfHead(repository);
    repository.git({"checkout", "--quiet", "--detach"});
    expectIdOfHead(repository);
    repository.git({"worktree", "add", "--quiet", folder() / "linked"});
    expectIdOfHead(GitRepository(folder() / "linked"));
}

TEST_F(GitRepositoryTest, KnowsTheGitFolderOfEachKind)
{
    const auto expectGitFolder = [](const GitRepository &repository)
    {
        EXPECT_EQ(repository.gitFolder(), repository.line({"rev-parse", "--absolute-git-dir"}));
        EXPECT_EQ(fs::canonical(repository.path() / repository.sharedGitFolder()),
                  repository.line({"rev-parse", "--path-format=absolute", "--git-common-dir"}));
    };
    auto repository = makeRepository();
    repository.commit("first");
    repository.git({"worktree", "add", "--quiet", folder() / "linked"});
    repository.git({"clone", "--quiet", "--bare", ".", folder() / "bare"});
    repository.git({"submodule", "--quiet", "add", folder() / "bare", "module"});
    expectGitFolder(repository);
    for (const auto *name : {"linked", "bare", "repository/module"})
        expectGitFolder(GitRepository(folder() / name));
}

TEST_F(GitRepositoryTest, IdentifiesAsGitConfigDoes)
{
    const auto repository = makeRepository("one");
    repository.identify("J. Random", "j@example.com");
    const auto twin = makeRepository("two");
    twin.git({"config", "user.name", "J. Random"});
    twin.git({"config", "user.email", "j@example.com"});
    EXPECT_EQ(repository.read(".git/config"), twin.read(".git/config"));
}

TEST_F(GitRepositoryTest, ChecksObjectsReferencesAndTheIndex)
{
    auto repository = makeRepository();
    repository.write("file", "text");
    const auto id = repository.commitAll("first");
    EXPECT_TRUE(repository.check().succeeded());
    const auto expectFault = [&](const std::string &name)
    {
        const std::string bytes = repository.read(name);
        repository.remove(name);
        repository.write(name, bytes.substr(0, bytes.size() - 1) + '?');
        EXPECT_FALSE(repository.check().succeeded()) << name;
        repository.remove(name);
        repository.write(name, bytes);
    };
    expectFault(".git/objects/" + id.substr(0, 2) + '/' + id.substr(2));
    expectFault(".git/refs/heads/main");
    expectFault(".git/index");
    EXPECT_TRUE(repository.check().succeeded());
}

TEST_F(GitRepositoryTest, RaisesWithTheWordsOfGit)
{
    const auto repository = makeRepository();
    EXPECT_THAT(
        [&] {
            repository.git({"rev-parse", "--verify", "nothing"});
        },
        testing::ThrowsMessage<std::runtime_error>(
            testing::AllOf(HasSubstr("rev-parse --verify nothing"),
                           HasSubstr("fatal: Needed a single revision"))));
    EXPECT_EQ(repository.tryGit({"rev-parse", "--verify", "nothing"}).exitStatus, 128);
}

} // namespace
