// SPDX-License-Identifier: MIT
// The lines of docs/linking.md as they stand there, each in a folder with a host's main.cpp,
// against an installation that was moved; and the examples that are installed with the documents.
#include <filesystem>
#include <fstream>
#include <string>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "InstalledFixture.hpp"
#include "support/readFile.hpp"
#include "support/strings.hpp"

namespace
{

using namespace vclink::test;
using testing::HasSubstr;
using testing::SizeIs;

/// The first block of this language.
std::string blockOf(const std::string &language)
{
    const std::string page = readFile(VCLINK_SOURCE_FOLDER "/docs/linking.md");
    const std::string mark = "\n```" + language + "\n";
    // The first block of the shell is about building.
    const auto begin = page.find(mark, page.find("## Linking")) + mark.size();
    return page.substr(begin, page.find("```", begin) - begin);
}

class DocumentedLines : public InstalledFixture
{
  protected:
    /// examples/embed's main.cpp.
    void writePlainHost() const
    {
        std::filesystem::copy(VCLINK_SOURCE_FOLDER "/examples/embed/main.cpp",
                              folder() / "main.cpp");
    }
    /// One that logs what it does.
    void writeLoggingHost() const
    {
        std::ofstream source(folder() / "main.cpp");
        source << readFile(VCLINK_SOURCE_FOLDER "/examples/integrating/log.cpp")
               << "#include \"vclink/git/LibGit2Guard.hpp\"\n"
                  "int main()\n{\n    showLog();\n    vclink::git::LibGit2Guard guard;\n}\n";
    }
    void runLine(const std::string &line)
    {
        runToSuccess(Command({"sh", "-c", line})
                         .in(folder().path())
                         .environment("PKG_CONFIG_PATH", libraries().string() + "/pkgconfig"));
    }
    std::filesystem::path libraries() const
    {
        return prefix_ / VCLINK_LIBRARY_FOLDER;
    }
    void expectToList(const std::filesystem::path &program, const std::string &libraries = {}) const
    {
        const auto shown = Command({program.string(), repository_.path().string()})
                               .environment("LD_LIBRARY_PATH", libraries)
                               .run();
        EXPECT_EQ(shown.output, describeWorkingCopy(repository_)) << shown.errors;
    }
    static void expectToLog(const std::filesystem::path &program, const std::string &libraries = {})
    {
        const auto run =
            Command({program.string()}).environment("LD_LIBRARY_PATH", libraries).run();
        EXPECT_EQ(run.exitStatus, 0);
        EXPECT_THAT(run.errors, HasSubstr("8 Unregister merge driver: *\n"));
    }

    std::filesystem::path prefix_ = installAndMove();
    GitRepository repository_ = makeWorkingCopy();
};

TEST_F(DocumentedLines, OfPkgConfigBuildAHostEach)
{
    const std::vector<std::string> lines = split(blockOf("sh"));
    ASSERT_THAT(lines, SizeIs(3));
    writePlainHost();
    runLine(lines[0]);
    expectToList(folder() / "application", libraries().string());
    runLine(lines[2]);
    std::filesystem::rename(folder() / "application", folder() / "found by itself");
    expectToList(folder() / "found by itself");
    writeLoggingHost();
    runLine(lines[1]);
    expectToLog(folder() / "application", libraries().string());
}

TEST_F(DocumentedLines, OfCMakeBuildAHostWithSinks)
{
    std::filesystem::create_directory(folder() / "project");
    std::ofstream(folder() / "project/CMakeLists.txt") << blockOf("cmake");
    writeLoggingHost();
    std::filesystem::rename(folder() / "main.cpp", folder() / "project/main.cpp");
    expectToLog(buildAgainst(prefix_, folder() / "project") / "application");
}

TEST_F(DocumentedLines, OfIntegratingAreProjectsOfTheInstalledExamples)
{
    const auto examples = prefix_ / "share/doc/libvclink-git-dev/examples";
    buildAgainst(prefix_, examples / "integrating");
}

} // namespace
