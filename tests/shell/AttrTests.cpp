// SPDX-License-Identifier: MIT
#include <gmock/gmock.h>

#include "ShellMergeFixture.hpp"

namespace vclink::test
{
namespace
{

using testing::HasSubstr;

class ShellAttributes : public ShellMergeFixture
{
  protected:
    ShellAttributes()
    {
        repository_.write(".gitattributes", "*.bin -text merge=binary\n"
                                            "a text diff=x\n"
                                            "b !text binary\n"
                                            "folder/c eol=lf mark\n"
                                            "/top only-at-the-root\n");
        repository_.write("folder/.gitattributes", "deep/* text=auto\n");
    }

    /// The lines for one file, made of what git says of it there.
    std::string askGit(const std::filesystem::path &place, const std::string &path,
                       const std::vector<std::string> &names) const
    {
        std::vector<std::string> arguments{"check-attr", "-z"};
        arguments.insert(arguments.end(), names.begin(), names.end());
        arguments.insert(arguments.end(), {"--", path});
        const std::vector<std::string> fields = split(GitRepository(place).git(arguments), '\0');
        std::string lines;
        for (std::size_t field = 0; field + 2 < fields.size(); field += 3)
            lines += serialize(fields[field + 1], fields[field + 2]) + '\n';
        return lines;
    }
    std::string ask(const std::filesystem::path &place, const std::string &path,
                    const std::vector<std::string> &names) const
    {
        std::vector<std::string> arguments{"attr", "--", path};
        arguments.insert(arguments.end(), names.begin(), names.end());
        const CommandResult result = runIn(place, arguments);
        EXPECT_EQ(result.exitStatus, 0) << result.errors;
        EXPECT_EQ(result.errors, "");
        return result.output;
    }

  private:
    static std::string serialize(const std::string &name, const std::string &state)
    {
        if (state == "set")
            return name;
        if (state == "unset")
            return "-" + name;
        return state == "unspecified" ? "!" + name : name + "=" + state;
    }
};

TEST_F(ShellAttributes, AreOneLineEachInTheirOwnSyntax)
{
    EXPECT_EQ(run({"attr", "a", "text", "diff", "merge"}).output, "text\ndiff=x\n!merge\n");
    EXPECT_EQ(run({"attr", "x.bin", "text"}).output, "-text\n");
}

TEST_F(ShellAttributes, AreWhatGitSaysOfThem)
{
    const std::vector<std::string> names{"text", "diff",   "merge",   "eol",
                                         "mark", "binary", "nothing", "only-at-the-root"};
    for (const std::string path : {"a", "b", "x.bin", "folder/x.bin", "folder/c", "folder/deep/d",
                                   "top", "folder/top", "gone/for/good", "a\\b", "[a]", "{}",
                                   "ub\xC3\xBC.bin", "\xFF.bin", "-a.bin", "new\nline.bin"})
        EXPECT_EQ(ask(repository_.path(), path, names), askGit(repository_.path(), path, names))
            << path;
}

TEST_F(ShellAttributes, AreThoseOfThePathFromTheCurrentFolder)
{
    const std::filesystem::path place = repository_ / "folder";
    const std::vector<std::string> names{"text", "eol", "diff"};
    for (const std::string &path :
         {std::string("c"), std::string("../a"), std::string("deep/d"), std::string("./deep/../c"),
          std::string("deep/../../a"), std::string("gone/../c"), (repository_ / "a").string()})
        EXPECT_EQ(ask(place, path, names), askGit(place, path, names)) << path;
}

TEST_F(ShellAttributes, AreThoseOfALinkAndNotOfItsTarget)
{
    repository_.symlink("a", "link");
    EXPECT_EQ(ask(repository_.path(), "link", {"text"}),
              askGit(repository_.path(), "link", {"text"}));
    EXPECT_EQ(ask(repository_.path(), "link", {"text"}), "!text\n");
}

TEST_F(ShellAttributes, AreFoundWhereALinkLeadsToTheWorkingCopy)
{
    GitRepository(folder().path()).symlink(repository_.path().string(), "way");
    const std::string path = (folder() / "way/folder/c").string();
    EXPECT_EQ(ask(repository_.path(), path, {"eol"}), "eol=lf\n");
}

TEST_F(ShellAttributes, MayHaveAnyName)
{
    repository_.write(".gitattributes", "a - {} quo\"te=x\\y ++\n");
    for (const std::string name : {"{}", "[]", "++", "quo\"te", "ub\xC3\xBC", "two words", "-n"})
    {
        const CommandResult result = run({"attr", "a", "--", name});
        EXPECT_EQ(result.exitStatus, 0) << name << result.errors;
        EXPECT_THAT(result.output, HasSubstr(name));
    }
}

TEST_F(ShellAttributes, DoNothingToTheTerminal)
{
    repository_.write(".gitattributes", "a text=\33[2J\n");
    EXPECT_EQ(run({"attr", "a", "text"}).output, "text=\\033[2J\n");
}

TEST_F(ShellAttributes, AreRefusedForWhatIsNoFileInTheWorkingCopy)
{
    for (const std::string path : {"..", "../x", "/", "/etc/passwd", "../repository2/a"})
        EXPECT_EQ(refuse({"attr", path, "text"}),
                  path + " is not in the working copy " + repository_.path().string() + ".\n");
}

} // namespace
} // namespace vclink::test
