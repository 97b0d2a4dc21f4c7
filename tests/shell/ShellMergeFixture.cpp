// SPDX-License-Identifier: MIT
#include "ShellMergeFixture.hpp"

namespace vclink::test
{

ShellMergeFixture::ShellMergeFixture()
{
    repository_.identify("A", "a@example.org");
}

void ShellMergeFixture::commitFiles(const Files &files)
{
    for (const auto &[name, text] : files)
        repository_.write(name, text);
    repository_.commitAll("work");
}

void ShellMergeFixture::makeBranch(const std::string &name, const Files &files)
{
    const std::string current = repository_.line({"symbolic-ref", "--short", "HEAD"});
    repository_.git({"checkout", "--quiet", "-b", name, "--"});
    commitFiles(files);
    repository_.git({"checkout", "--quiet", current, "--"});
}

void ShellMergeFixture::diverge()
{
    makeBranch("other", {{"a", "theirs\n"}, {"new", "theirs\n"}});
    commitFiles({{"b", "ours\n"}});
}

void ShellMergeFixture::clash()
{
    makeBranch("other", {{"a", "theirs\n"}, {"b", "theirs\n"}});
    commitFiles({{"a", "ours\n"}, {"folder/c", "ours\n"}});
}

CommandResult ShellMergeFixture::run(const std::vector<std::string> &arguments) const
{
    return runIn(repository_.path(), arguments);
}

std::string ShellMergeFixture::fail(const std::vector<std::string> &arguments) const
{
    const CommandResult result = run(arguments);
    EXPECT_EQ(result.exitStatus, 1) << result.errors;
    EXPECT_EQ(result.output, "");
    return result.errors;
}

std::string ShellMergeFixture::head() const
{
    return repository_.line({"rev-parse", "HEAD"});
}

std::string ShellMergeFixture::state() const
{
    return run({"state"}).output;
}

GitRepository ShellMergeFixture::makeTwin() const
{
    const std::filesystem::path twin = folder() / "twin";
    std::filesystem::copy(repository_.path(), twin, std::filesystem::copy_options::recursive);
    return GitRepository(twin);
}

std::string ShellMergeFixture::describe(const GitRepository &repository)
{
    std::string text = repository.git({"status", "--porcelain", "-z"}) +
                       repository.git({"ls-files", "--stage", "-z"}) +
                       repository.git({"log", "-1", "--format=%T %P%n%s%n%b"});
    for (const auto &name : split(repository.git({"ls-files", "--cached", "--others", "-z"}), '\0'))
    {
        if (std::filesystem::is_regular_file(repository / name))
            text += name + ":\n" + repository.read(name);
    }
    return text;
}

} // namespace vclink::test
