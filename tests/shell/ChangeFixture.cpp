// SPDX-License-Identifier: MIT
#include "ChangeFixture.hpp"

namespace vclink::test
{

ChangeFixture::ChangeFixture()
{
    for (const std::string name : {"a", "b", "folder/c", "folder/deep/d"})
        repository_.write(name, name + '\n');
    repository_.write(".gitignore", "*.ignored\n");
    repository_.commitAll("begin");
    repository_.write("x.ignored", "");
}

void ChangeFixture::succeed(const std::vector<std::string> &arguments) const
{
    const Command command = shell(arguments).in(repository_.path());
    const CommandResult result = command.run();
    EXPECT_EQ(result.exitStatus, 0) << command.text();
    EXPECT_EQ(result.output, "") << command.text();
    for (const std::string &line : split(result.errors, '\n'))
    {
        const bool isWayBack = line.rfind("To restore what was ", 0) == 0 ||
                               line.rfind("Before you restore, ", 0) == 0;
        EXPECT_TRUE(isWayBack) << command.text() << line;
    }
}

std::string ChangeFixture::fail(const std::vector<std::string> &arguments) const
{
    const Command command = shell(arguments).in(repository_.path());
    const CommandResult result = command.run();
    EXPECT_EQ(result.exitStatus, 1) << command.text();
    EXPECT_EQ(result.output, "") << command.text();
    return result.errors;
}

std::string ChangeFixture::refuse(const std::vector<std::string> &arguments) const
{
    const std::string before = everything();
    const std::string errors = fail(arguments);
    EXPECT_EQ(everything(), before) << errors;
    const std::string program = "vclink-shell: ";
    EXPECT_EQ(errors.substr(0, program.size()), program);
    return errors.substr(program.size());
}

std::map<std::string, std::string> ChangeFixture::letters() const
{
    std::map<std::string, std::string> letters;
    const std::string report =
        repository_.git({"status", "--porcelain", "-z", "-uall", "--no-renames"});
    for (const auto &line : split(report, '\0'))
        letters[line.substr(3)] = line.substr(0, 2);
    return letters;
}

std::vector<std::string> ChangeFixture::committed() const
{
    return split(repository_.git({"ls-tree", "-r", "-z", "--name-only", "HEAD"}), '\0');
}

void ChangeFixture::makeConflict()
{
    repository_.git({"checkout", "--quiet", "-b", "other"});
    repository_.write("a", "theirs\n");
    repository_.write("b", "theirs\n");
    repository_.commitAll("their work");
    repository_.git({"checkout", "--quiet", "main"});
    repository_.write("a", "ours\n");
    repository_.commitAll("our work");
    const CommandResult merge = repository_.tryGit(
        {"-c", "user.name=A", "-c", "user.email=a@example.org", "merge", "other"});
    ASSERT_EQ(merge.exitStatus, 1) << merge.errors;
    ASSERT_EQ(letters().at("a"), "UU");
}

std::string ChangeFixture::everything() const
{
    namespace fs = std::filesystem;
    std::map<std::string, std::string> files;
    for (const auto &entry : fs::recursive_directory_iterator(repository_.path()))
    {
        const std::string name = entry.path().lexically_relative(repository_.path()).string();
        // What nothing refers to may be left behind there.
        if (name.rfind(".git/objects/", 0) == 0)
            continue;
        if (entry.is_symlink())
            files[name] = fs::read_symlink(entry.path()).string();
        else if (entry.is_regular_file())
            files[name] = repository_.read(name);
    }
    std::string text;
    for (const auto &[name, content] : files)
        text += name + '\0' + content + '\0';
    return text;
}

} // namespace vclink::test
