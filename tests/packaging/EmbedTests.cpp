// SPDX-License-Identifier: MIT
// examples/embed as a project of its own: built against an installation that was moved, by each of
// the two ways that it shows, and run on a working copy.
#include <algorithm>
#include <filesystem>
#include <fstream>
#include <string>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "InstalledFixture.hpp"
#include "support/readFile.hpp"

namespace
{

using namespace vclink::test;
using testing::HasSubstr;

const std::filesystem::path project = VCLINK_SOURCE_FOLDER "/examples/embed";

/// The command in the head of the source.
std::string commandOfSource()
{
    const std::string source = readFile(project / "main.cpp");
    const std::string mark = "\n//     c++ ";
    const auto begin = source.find(mark) + mark.size() - 4;
    return source.substr(begin, source.find('\n', begin) - begin);
}

class Embed : public InstalledFixture
{
  protected:
    /// Runs it on a working copy, and where there is none that can be shown.
    /// @param libraries where the system does not look by itself
    void expectToWork(const std::filesystem::path &program, const std::string &libraries = {})
    {
        const auto run = [&](const std::string &argument) {
            return Command({program.string(), argument})
                .environment("LD_LIBRARY_PATH", libraries)
                .run();
        };
        const auto repository = makeWorkingCopy();
        const auto shown = run(repository.path().string());
        EXPECT_EQ(shown.output, describeWorkingCopy(repository)) << shown.errors;
        EXPECT_EQ(shown.errors, "");
        EXPECT_EQ(shown.exitStatus, 0);

        const auto none = run(folder().path().string());
        EXPECT_EQ(none.errors, "no working copy of Git\n");
        EXPECT_EQ(none.exitStatus, 1);

        std::filesystem::create_directory(folder() / "broken");
        std::ofstream(folder() / "broken" / ".git") << "no link to a repository\n";
        const auto broken = run((folder() / "broken").string());
        EXPECT_THAT(broken.errors, HasSubstr("the `.git` file at "));
        EXPECT_EQ(broken.exitStatus, 1);
    }
};

TEST_F(Embed, IsBuiltByItsCMakeProject)
{
    const auto prefix = installAndMove();
    const auto build = buildAgainst(prefix, project);
    EXPECT_THAT(readFile(build / "CMakeCache.txt"),
                HasSubstr("vclink_git_DIR:PATH=" + prefix.string() + "/"));
    expectToWork(build / "embed");
}

TEST_F(Embed, IsBuiltByItsLineOfPkgConfig)
{
    const auto prefix = installAndMove();
    const std::string libraries = (prefix / VCLINK_LIBRARY_FOLDER).string();
    std::filesystem::copy(project / "main.cpp", folder() / "main.cpp");
    const std::string line = commandOfSource();
    ASSERT_THAT(line, HasSubstr("$(pkg-config --cflags --libs vclink_git)"));
    runToSuccess(Command({"sh", "-c", line})
                     .in(folder().path())
                     .environment("PKG_CONFIG_PATH", libraries + "/pkgconfig"));
    expectToWork(folder() / "embed", libraries);
}

TEST_F(Embed, IsTheSmallestHost)
{
    const std::string source = readFile(project / "main.cpp");
    EXPECT_LT(std::count(source.begin(), source.end(), '\n'), 100);
}

} // namespace
