// SPDX-License-Identifier: MIT
#include "StagingFixture.hpp"

#include <filesystem>

#include "support/UnprivilegedUser.hpp"
#include "support/strings.hpp"

namespace vclink::test
{

namespace fs = std::filesystem;

StagingFixture::StagingFixture()
{
    for (const auto *name : {"file", "other", "sub/inside"})
        repository_.write(name, std::string("content of ") + name + "\n");
    repository_.commitAll("first");
}

void StagingFixture::add(const std::vector<std::string> &names) const
{
    makeAdapter(repository_.path())->addFiles(files(names));
}

void StagingFixture::remove(const std::vector<std::string> &names) const
{
    makeAdapter(repository_.path())->removeFiles(files(names));
}

void StagingFixture::markResolved(const std::string &name) const
{
    makeAdapter(repository_.path())->markResolved(files({name}).front());
}

void StagingFixture::revert(const std::vector<std::string> &names) const
{
    makeAdapter(repository_.path())->revertFiles(files(names));
}

void StagingFixture::expectRevertsAsGit(const std::vector<std::string> &names) const
{
    std::vector<std::string> restore{"restore", "--source=HEAD", "--staged", "--worktree", "--"};
    restore.insert(restore.end(), names.begin(), names.end());
    const RepositoryState expected = stateAfterGit({restore});
    revert(names);
    EXPECT_EQ(stateOf(repository_), expected);
}

std::vector<upath> StagingFixture::files(const std::vector<std::string> &names) const
{
    return asPaths(inRoot(names));
}

std::vector<std::string> StagingFixture::inRoot(const std::vector<std::string> &names) const
{
    std::vector<std::string> paths;
    for (const auto &name : names)
        paths.push_back(repository_.path().string() + '/' + name);
    return paths;
}

std::vector<std::string> StagingFixture::status() const
{
    return split(repository_.git({"--no-optional-locks", "status", "--porcelain",
                                  "--untracked-files=all", "--no-renames", "-z"}),
                 '\0');
}

RepositoryState
StagingFixture::stateAfterGit(const std::vector<std::vector<std::string>> &commands) const
{
    const fs::path copy = folder() / "copy";
    fs::remove_all(copy);
    // A program of its own, since the standard library copies no FIFO.
    const auto copied = Command({"cp", "-a", repository_.path().string(), copy.string()}).run();
    EXPECT_TRUE(copied.succeeded()) << copied.errors;
    const GitRepository twin(copy);
    for (const auto &command : commands)
        twin.git(command);
    return stateOf(twin);
}

std::string StagingFixture::unprivilegedFailureOf(const std::function<void()> &action) const
{
    return runAsUnprivilegedUser([&] { return printed(failureOf(action)); });
}

void StagingFixture::giveAway() const
{
    repository_.git({"config", "--global", "--add", "safe.directory", repository_.path().string()});
    repository_.git(
        {"config", "--global", "--add", "safe.directory", (folder() / "copy").string()});
    giveToUnprivilegedUser(folder().path());
}

void StagingFixture::beginMerge(const std::vector<std::string> &names)
{
    const auto commitSide = [&](const std::string &content)
    {
        for (const auto &name : names)
            repository_.write(name, content);
        repository_.commitAll(content);
    };
    commitSide("base\n");
    repository_.git({"branch", "theirs"});
    commitSide("ours\n");
    repository_.git({"checkout", "--quiet", "theirs"});
    commitSide("theirs\n");
    repository_.git({"checkout", "--quiet", "main"});
    repository_.tryGit(
        {"-c", "user.name=T", "-c", "user.email=t@example.com", "merge", "--quiet", "theirs"});
    for (const auto &name : names)
        ASSERT_EQ(states(repository_, {name}), (States{{name, "InConflict"}}));
}

void StagingFixture::addModule()
{
    auto inner = makeRepository("inner");
    inner.write("file", "x");
    inner.commitAll("first");
    inner.commit("second");
    repository_.git({"submodule", "--quiet", "add", inner.path().string(), "module"});
    repository_.commit("second");
}

} // namespace vclink::test
