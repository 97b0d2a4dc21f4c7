// SPDX-License-Identifier: MIT
#include <filesystem>
#include <string>

#include <git2.h>
#include <gtest/gtest.h>

#include "support/Descriptors.hpp"
#include "support/Failure.hpp"
#include "support/GitFixture.hpp"
#include "support/LibGit2Session.hpp"
#include "support/text.hpp"
#include "util/repository/repository.hpp"

namespace
{

namespace git = vclink::git;
using namespace vclink::test;

std::string asHex(const git_oid &id)
{
    return git_oid_tostr_s(&id);
}

class RepositoryHelpers : public GitFixture
{
  protected:
    git::OwnedHandle<git_repository> open(const GitRepository &repository) const
    {
        return git::openRepository(asPath(repository.path()));
    }

    LibGit2Session session_{environment()};
};

TEST_F(RepositoryHelpers, OpenANewHandleOfTheFoldersRepositoryEachTimeAndNothingAboveIt)
{
    const auto repository = makeRepository("gr\xC3\xBC\xC3\x9F \xFF");
    repository.makeFolder("sub");
    open(repository);
    const NoDescriptorLeak noLeak;
    const auto first = open(repository);
    const auto second = open(repository);
    EXPECT_NE(first.get(), second.get());
    EXPECT_EQ(git_repository_workdir(first.get()), repository.path().string() + "/");
    EXPECT_EQ(git_repository_is_bare(first.get()), 0);
    const auto failureToOpen = [&](const std::string &name) {
        return failureOf([&]
                         { static_cast<void>(git::openRepository(asPath(repository / name))); });
    };
    EXPECT_EQ(failureToOpen("missing").code, GIT_ENOTFOUND);
    const auto error = failureToOpen("sub");
    EXPECT_EQ(error.code, GIT_ENOTFOUND);
    EXPECT_EQ(error.errorClass, GIT_ERROR_REPOSITORY);
    EXPECT_NE(error.text.find("could not find repository"), std::string::npos);
}

TEST_F(RepositoryHelpers, GetAndWriteTheIndexOrRaiseWhereItIsLockedOrCannotBeRead)
{
    const auto repository = makeRepository();
    repository.write("file", "x");
    const auto opened = open(repository);
    {
        const auto index = git::getRepositoryIndex(opened.get());
        EXPECT_EQ(git_index_owner(index.get()), opened.get());
        ASSERT_EQ(git_index_add_bypath(index.get(), "file"), 0);
        repository.write(".git/index.lock", "");
        EXPECT_EQ(failureOf([&] { git::writeIndex(index.get()); }).code, GIT_ELOCKED);
        EXPECT_TRUE(std::filesystem::exists(repository / ".git/index.lock"));
        EXPECT_FALSE(std::filesystem::exists(repository / ".git/index"));
        repository.remove(".git/index.lock");
        git::writeIndex(index.get());
    }
    EXPECT_EQ(repository.git({"ls-files"}), "file\n");
    const auto again = open(repository);
    EXPECT_EQ(git_index_entrycount(git::getRepositoryIndex(again.get()).get()), 1U);
    repository.write(".git/index",
                     "this is no index, and long enough to be told from an empty one");
    const auto broken = open(repository);
    const auto error = failureOf([&] { static_cast<void>(git::getRepositoryIndex(broken.get())); });
    EXPECT_EQ(error.code, GIT_ERROR);
    EXPECT_EQ(error.errorClass, GIT_ERROR_INDEX);
}

TEST_F(RepositoryHelpers, WriteTheTreeThatGitWrites)
{
    auto repository = makeRepository();
    for (const auto *name : {"b", "sub/deep/c", "a", "\xFF"})
        repository.write(name, name);
    repository.write("tool", "x");
    repository.setMode("tool", 0755);
    repository.symlink("a", "link");
    repository.add();
    const auto opened = open(repository);
    const auto index = git::getRepositoryIndex(opened.get());
    const git_oid id = git::writeIndexTree(index.get());
    EXPECT_EQ(asHex(id), repository.line({"write-tree"}));
}

TEST_F(RepositoryHelpers, RaiseForATreeOfAnIndexInConflict)
{
    auto repository = makeRepository();
    repository.write("file", "base\n");
    repository.commitAll("base");
    repository.git({"checkout", "--quiet", "-b", "other"});
    repository.write("file", "theirs\n");
    repository.commitAll("theirs");
    repository.git({"checkout", "--quiet", "main"});
    repository.write("file", "ours\n");
    repository.commitAll("ours");
    repository.tryGit({"-c", "user.name=T", "-c", "user.email=t@example.com", "merge", "other"});
    ASSERT_NE(repository.git({"ls-files", "--unmerged"}), "");
    const auto opened = open(repository);
    const auto index = git::getRepositoryIndex(opened.get());
    EXPECT_EQ(failureOf([&] { git::writeIndexTree(index.get()); }).code, GIT_EUNMERGED);
}

TEST_F(RepositoryHelpers, LookATreeUpOrRaiseForAnIdThatIsNone)
{
    auto repository = makeRepository();
    repository.write("sub/file", "x");
    const std::string commit = repository.commitAll("first");
    const auto opened = open(repository);
    git_oid id;
    ASSERT_EQ(git_oid_fromstr(&id, repository.line({"rev-parse", "HEAD^{tree}"}).c_str()), 0);
    const auto tree = git::lookupTree(opened.get(), &id);
    EXPECT_EQ(git_tree_entrycount(tree.get()), 1U);
    EXPECT_STREQ(git_tree_entry_name(git_tree_entry_byindex(tree.get(), 0)), "sub");
    for (const std::string &none : {commit, std::string(40, '1')})
    {
        ASSERT_EQ(git_oid_fromstr(&id, none.c_str()), 0);
        EXPECT_EQ(failureOf([&] { static_cast<void>(git::lookupTree(opened.get(), &id)); }).code,
                  GIT_ENOTFOUND);
    }
}

} // namespace
