// SPDX-License-Identifier: MIT
#include <utility>

#include <gmock/gmock.h>

#include "ShellRemoteFixture.hpp"

namespace vclink::test
{
namespace
{

using testing::HasSubstr;
using testing::IsEmpty;

class ShellHeads : public ShellRemoteFixture
{
  protected:
    /// What git says, written as the program does: git lists symbolic references first.
    std::string expected() const
    {
        std::string text;
        std::string target;
        for (const std::string &line :
             split(repository_.git({"ls-remote", "--symref", "origin"}), '\n'))
        {
            if (line.rfind("ref: ", 0) == 0)
                target = '\t' + line.substr(5, line.find('\t') - 5);
            else
                text += line + std::exchange(target, {}) + '\n';
        }
        return text;
    }
};

TEST_F(ShellHeads, AreThoseThatGitShows)
{
    repository_.git({"tag", "light"});
    repository_
        .command({"-c", "user.name=A", "-c", "user.email=a@example.org", "tag", "-a", "-m", "whole",
                  "whole"})
        .run();
    repository_.git({"push", "--quiet", "origin", "main:other", "light", "whole"});
    const CommandResult result = run({"heads", "origin"});
    EXPECT_EQ(result.exitStatus, 0) << result.errors;
    EXPECT_EQ(result.errors, "");
    EXPECT_EQ(result.output, expected());
    EXPECT_THAT(result.output, HasSubstr("\tHEAD\trefs/heads/main\n"));
    EXPECT_THAT(result.output, HasSubstr("\trefs/tags/whole^{}\n"));
}

TEST_F(ShellHeads, AreNoneForAnEmptyRemote)
{
    repository_.git({"remote", "set-url", "origin", server().url(server().makeRepository())});
    const CommandResult result = run({"heads", "origin"});
    EXPECT_EQ(result.exitStatus, 0) << result.errors;
    EXPECT_THAT(result.output, IsEmpty());
    EXPECT_THAT(result.errors, IsEmpty());
}

TEST_F(ShellHeads, AreQuotedForALineAndPlainBeforeANul)
{
    const std::string id = repository_.line({"rev-parse", "main"});
    for (const std::string name : {"quo\"te", "ub\xC3\xBC", "byte\xFF"})
        served_.git({"update-ref", "refs/heads/" + name, id});
    const std::string lines = run({"heads", "origin"}).output;
    EXPECT_THAT(lines, HasSubstr('\n' + id + "\t\"refs/heads/quo\\\"te\"\n"));
    EXPECT_THAT(lines, HasSubstr('\n' + id + "\trefs/heads/ub\xC3\xBC\n"));
    EXPECT_THAT(lines, HasSubstr('\n' + id + "\t\"refs/heads/byte\\377\"\n"));

    const std::vector<std::string> records = split(run({"heads", "-z", "origin"}).output, '\0');
    EXPECT_THAT(records, testing::UnorderedElementsAre(
                             id + "\tHEAD\trefs/heads/main", id + "\trefs/heads/main",
                             id + "\trefs/heads/quo\"te", id + "\trefs/heads/ub\xC3\xBC",
                             id + "\trefs/heads/byte\xFF"));
}

TEST_F(ShellHeads, AreCountedForAPerson)
{
    EXPECT_THAT(show({"heads", "origin"}), testing::EndsWith("2 references\n"));
}

TEST_F(ShellHeads, AreFoundFromTheRootWhereTheAddressIsARelativePath)
{
    GitRepository::clone(url_, folder() / "colleague");
    repository_.git({"remote", "add", "near", "../colleague"});
    const CommandResult result = runIn(repository_ / "folder", {"heads", "near"});
    EXPECT_EQ(result.exitStatus, 0) << result.errors;
    EXPECT_THAT(result.output, HasSubstr("\trefs/heads/main\n"));
}

TEST_F(ShellHeads, CannotBeAskedOfARemoteThatIsNotThere)
{
    EXPECT_THAT(refuse({"heads", "nobody"}), HasSubstr("There is no remote 'nobody'."));
    repository_.git({"remote", "set-url", "origin", server().base() + "/missing.git"});
    EXPECT_THAT(refuse({"heads", "origin"}), HasSubstr("no such repository"));
}

} // namespace
} // namespace vclink::test
