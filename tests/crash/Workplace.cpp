// SPDX-License-Identifier: MIT
#include "Workplace.hpp"

#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "support/strings.hpp"

namespace vclink::test
{
namespace
{

namespace fs = std::filesystem;

constexpr int filesOfUpstream = 20;

std::string entriesOfUser()
{
    std::string entries = "[core]\n\tpreloadIndex = false\n[user]\n\tname = Test Person\n"
                          "\temail = person@example.com\n[mine]\n";
    for (int entry = 0; entry < 200; ++entry)
        entries += "\tentry" + std::to_string(entry) + " = kept\n";
    return entries;
}

void expectReached(const GitRepository &repository, const std::set<std::string> &commits)
{
    const auto reached = split(repository.tryGit({"rev-list", "--all"}).output);
    EXPECT_THAT(reached, testing::IsSupersetOf(commits)) << "lost in " << repository.path();
}

} // namespace

Workplace::Workplace(const fs::path &folder, const fs::path &home)
    : folder_(folder), home_(home), repository_(GitRepository::init(folder / "repository")),
      source_(GitRepository::init(folder / "source"))
{
    GitRepository(home_).write(".gitconfig", entriesOfUser());
    configuration_ = repository_.git({"config", "--global", "--get-regexp", "^(user|mine)\\."});
    repository_.write("file", "file\n");
    repository_.write(".gitattributes", "driven/* merge=joining\n");
    // A command merges only what both sides have had.
    for (const auto *name : {"driven/0", "driven/1", "driven/2", "driven/3"})
        repository_.write(name, std::string(name) + '\n');
    GitRepository(folder_).write("join", "cat \"$2\" >>\"$1\"\n");
    repository_.git(
        {"config", "merge.joining.driver", "/bin/sh " + (folder_ / "join").string() + " %A %B"});
    repository_.commitAll("first");
    repository_.git({"branch", "topic"});
    repository_.git({"clone", "--quiet", "--bare", ".", folder_ / "origin"});
    repository_.git({"remote", "add", "origin", folder_ / "origin"});
    source_.git({"clone", "--quiet", "--bare", ".", folder_ / "upstream"});
    advanceUpstream();
    repository_.git({"remote", "add", "upstream", folder_ / "upstream"});
}

void Workplace::advanceUpstream()
{
    const std::string old = source_.tryGit({"rev-parse", "HEAD"}).output;
    for (int file = 0; file < filesOfUpstream; ++file)
        source_.write("from/" + std::to_string(file), old + std::string(2000, 'x') + old);
    source_.commitAll("upstream");
    source_.git({"push", "--quiet", folder_ / "upstream", "main"});
}

void Workplace::expectNothingLost(const std::set<std::string> &commits,
                                  const std::set<std::string> &pushed) const
{
    for (const char *name : {"repository", "origin"})
    {
        const auto checked = GitRepository(folder_ / name).check();
        EXPECT_TRUE(checked.succeeded()) << name << ": " << checked.output << checked.errors;
    }
    expectReached(repository_, commits);
    expectReached(GitRepository(folder_ / "origin"), pushed);
    EXPECT_EQ(repository_.tryGit({"config", "--global", "--get-regexp", "^(user|mine)\\."}).output,
              configuration_);
    EXPECT_TRUE(repository_.tryGit({"ls-files"}).succeeded());
}

std::size_t Workplace::removeLocks() const
{
    std::vector<fs::path> locks;
    for (const auto &folder : {folder_, home_})
        for (const auto &entry : fs::recursive_directory_iterator(folder))
            if (entry.path().extension() == ".lock")
                locks.push_back(entry.path());
    for (const auto &lock : locks)
        fs::remove(lock);
    return locks.size();
}

bool Workplace::isMerging() const
{
    return fs::exists(repository_ / ".git/MERGE_HEAD");
}

} // namespace vclink::test
