// SPDX-License-Identifier: MIT
// The Debian packages, which the fixture of these tests has made: what they say of themselves, and
// that a host is built against what they hold.
#include <chrono>
#include <filesystem>
#include <fstream>
#include <istream>
#include <map>
#include <regex>
#include <sstream>
#include <string>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "InstalledFixture.hpp"
#include "support/readFile.hpp"

namespace
{

using namespace vclink::test;
using testing::AllOf;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::Not;

const std::string library = "libvclink-git" VCLINK_SO_VERSION;
const std::string host = "libvclink-host" VCLINK_SO_VERSION;
const std::string development = "libvclink-git-dev";
const std::string hostDevelopment = "libvclink-host-dev";
const std::string shell = "vclink-shell";

class DebianPackages : public InstalledFixture
{
  protected:
    /// The packages' files by the packages' names.
    static std::map<std::string, std::filesystem::path>
    packages(const std::string &extension = ".deb")
    {
        std::map<std::string, std::filesystem::path> files;
        for (const auto &entry : std::filesystem::directory_iterator(VCLINK_PACKAGE_FOLDER))
        {
            if (entry.path().extension() == extension)
            {
                const std::string name = entry.path().filename().string();
                files.emplace(name.substr(0, name.find('_')), entry.path());
            }
        }
        return files;
    }

    static std::string field(const std::string &package, const std::string &name)
    {
        const auto text =
            runToSuccess(Command({"dpkg-deb", "--field", packages().at(package).string(), name}));
        return text.substr(0, text.find_last_not_of('\n') + 1);
    }

    /// Unpacks packages into one place, as on a machine that has them.
    std::filesystem::path unpack(const std::vector<std::string> &names) const
    {
        for (const auto &name : names)
        {
            runToSuccess(Command({"dpkg-deb", "--extract", packages().at(name).string(),
                                  (folder() / "machine").string()}));
        }
        return folder() / "machine";
    }
};

TEST_F(DebianPackages, AreOneForEachPurpose)
{
    std::vector<std::string> names;
    for (const auto &package : packages())
    {
        names.push_back(package.first);
    }
    EXPECT_THAT(names, ElementsAre(development, library, hostDevelopment, host, shell));
}

TEST_F(DebianPackages, CarryTheVersionAndTheMachine)
{
    for (const auto &package : packages())
    {
        EXPECT_EQ(field(package.first, "Version"), VCLINK_VERSION) << package.first;
        EXPECT_NE(field(package.first, "Architecture"), "all") << package.first;
        EXPECT_NE(field(package.first, "Description"), "") << package.first;
    }
}

TEST_F(DebianPackages, OfTheLibraryDependsOnWhatItIsLinkedWith)
{
    const std::string depends = field(library, "Depends");
    for (const auto *needed : {"libgit2-", "libboost-filesystem", "libboost-thread", "libc6"})
    {
        EXPECT_THAT(depends, HasSubstr(needed));
    }
    EXPECT_THAT(depends, HasSubstr(host + " (>= " VCLINK_VERSION ")"));
    // Dependencies of the stand-in only.
    EXPECT_THAT(depends, AllOf(Not(HasSubstr("locale")), Not(HasSubstr("-dev"))));
}

TEST_F(DebianPackages, OfTheLibraryWantsALibgit2WithTheKnownFixes)
{
    const std::string depends = field(library, "Depends");
    const std::string package = VCLINK_LIBGIT2_PACKAGE;
    ASSERT_THAT(package, testing::MatchesRegex("libgit2-[0-9.]+ \\(>= [^)]+\\)"));
    EXPECT_THAT(depends, HasSubstr(package));
    // The table that people read says the same.
    const std::string document = readFile(VCLINK_SOURCE_FOLDER "/docs/linking.md");
    const std::string version = package.substr(package.find(">= ") + 3);
    EXPECT_THAT(document, HasSubstr(version.substr(0, version.size() - 1)));
}

TEST_F(DebianPackages, OfTheStandInKnowsNothingOfTheLibrary)
{
    EXPECT_THAT(field(host, "Depends"), Not(HasSubstr("vclink")));
    EXPECT_THAT(field(hostDevelopment, "Depends"),
                AllOf(HasSubstr(host + " (= " VCLINK_VERSION ")"), HasSubstr("libboost-dev"),
                      Not(HasSubstr("vclink-git"))));
}

TEST_F(DebianPackages, ForDevelopmentDependOnTheSameLibraries)
{
    EXPECT_THAT(field(development, "Depends"),
                AllOf(HasSubstr(library + " (= " VCLINK_VERSION ")"), HasSubstr(hostDevelopment),
                      HasSubstr("libboost-dev")));
    EXPECT_EQ(field(development, "Suggests"), "libgit2-dev");
}

TEST_F(DebianPackages, NameTheLibraryForThoseThatDependOnIt)
{
    for (const auto &name : {library, host})
    {
        const auto shared =
            runToSuccess(Command({"dpkg-deb", "--info", packages().at(name).string(), "shlibs"}));
        EXPECT_THAT(shared,
                    HasSubstr(" " VCLINK_SO_VERSION " " + name + " (>= " VCLINK_VERSION ")"));
    }
}

TEST_F(DebianPackages, HoldFilesOfRootThatOthersCantWrite)
{
    for (const auto &package : packages())
    {
        std::istringstream list(
            runToSuccess(Command({"dpkg-deb", "--contents", package.second.string()})));
        for (std::string line; std::getline(list, line);)
        {
            EXPECT_THAT(line, HasSubstr(" root/root ")) << package.first;
            EXPECT_TRUE(line[0] == 'l' || (line[5] == '-' && line[8] == '-')) << line;
        }
    }
}

TEST_F(DebianPackages, TellTheLicenceAsDebiansToolsReadIt)
{
    std::ifstream file(VCLINK_SOURCE_FOLDER "/LICENSE");
    std::string head;
    std::string holder;
    std::getline(std::getline(file, head) >> std::ws, holder);
    std::string expected =
        "Format: https://www.debian.org/doc/packaging-manuals/"
        "copyright-format/1.0/\nUpstream-Name: vclink-git\n\nFiles: *\n" +
        std::regex_replace(holder, std::regex("^Copyright \\(c\\)"), "Copyright:") +
        "\nLicense: Expat\n";
    file >> std::ws;
    for (std::string line; std::getline(file, line);)
    {
        expected += line.empty() ? " .\n" : " " + line + "\n";
    }
    for (const auto &package : packages())
    {
        unpack({package.first});
        EXPECT_EQ(readFile(folder() / "machine/usr/share/doc" / package.first / "copyright"),
                  expected)
            << package.first;
    }
}

/// The packages list intended exceptions, with their reasons.
TEST_F(DebianPackages, HaveNothingThatDebiansPolicyRemarks)
{
    std::vector<std::string> lintian{"lintian", "--allow-root", "--fail-on", "error,warning"};
    for (const auto &package : packages())
    {
        lintian.push_back(package.second.string());
    }
    const auto result = Command(lintian).timeout(std::chrono::minutes(8)).run();
    EXPECT_TRUE(result.succeeded()) << result.output << result.errors;
}

/// VCLINK_LIBRARY_FOLDER is only what CMake has chosen.
TEST_F(DebianPackages, PutTheLibrariesWhereDebianLooksForThem)
{
    const std::string architecture =
        runToSuccess(Command({"dpkg-architecture", "--query", "DEB_HOST_MULTIARCH"}));
    const auto place = unpack({library, host, development, hostDevelopment}) / "usr/lib" /
                       architecture.substr(0, architecture.find('\n'));
    for (const auto *const name : {"libvclink_git.so", "libvclink_git.so." VCLINK_SO_VERSION,
                                   "libvclink_host.so", "libvclink_host.so." VCLINK_SO_VERSION})
    {
        EXPECT_TRUE(std::filesystem::exists(place / name)) << place / name;
    }
}

TEST_F(DebianPackages, LeaveWhatDebuggersReadToOthersThatMatch)
{
    const auto symbols = packages(".ddeb");
    for (const auto &name : {library, host, shell})
    {
        runToSuccess(Command({"dpkg-deb", "--extract", symbols.at(name + "-dbgsym").string(),
                              (folder() / "symbols").string()}));
    }
    const auto machine = unpack({library, host, shell});
    for (const auto *name :
         {"bin/vclink-shell", VCLINK_LIBRARY_FOLDER "/libvclink_git.so." VCLINK_SO_VERSION,
          VCLINK_LIBRARY_FOLDER "/libvclink_host.so." VCLINK_SO_VERSION})
    {
        const auto notes = runToSuccess(Command(
            {"readelf", "--notes", "--sections", "--wide", (machine / "usr" / name).string()}));
        EXPECT_THAT(notes, Not(HasSubstr(" .debug_info "))) << name;
        std::smatch id;
        ASSERT_TRUE(std::regex_search(notes, id, std::regex("Build ID: (..)([0-9a-f]+)"))) << notes;
        EXPECT_TRUE(std::filesystem::exists((folder() / "symbols") / "usr/lib/debug/.build-id" /
                                            id[1].str() / (id[2].str() + ".debug")))
            << name;
    }
}

TEST_F(DebianPackages, ServeAHostThatIsBuiltAgainstThem)
{
    const auto machine = unpack({library, development, host, hostDevelopment});
    const auto build = buildAgainst(machine / "usr", VCLINK_SOURCE_FOLDER "/examples/embed");
    const auto repository = makeWorkingCopy();
    const Command embed({(build / "embed").string(), repository.path().string()});
    EXPECT_EQ(runToSuccess(embed), describeWorkingCopy(repository));
}

TEST_F(DebianPackages, OfTheShellRunsOnThoseOfTheLibraries)
{
    const auto machine = unpack({library, host, shell});
    EXPECT_THAT(runToSuccess(Command({(machine / "usr/bin/vclink-shell").string(), "version"})),
                HasSubstr(VCLINK_VERSION));
}

} // namespace
