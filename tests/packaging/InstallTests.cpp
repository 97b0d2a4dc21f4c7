// SPDX-License-Identifier: MIT
// What each component installs, and that an installation knows neither where it was built nor where
// it was installed first.
#include <algorithm>
#include <filesystem>
#include <fstream>
#include <regex>
#include <string>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "InstalledFixture.hpp"
#include "support/readFile.hpp"

namespace
{

using namespace vclink::test;
using testing::ElementsAreArray;
using testing::HasSubstr;
using testing::Not;

const std::string libraries = VCLINK_LIBRARY_FOLDER;
const std::string version = VCLINK_VERSION;

/// The description of every package.
std::vector<std::string> with(std::vector<std::string> files, const std::string &package)
{
    files.push_back("share/doc/" + package + "/changelog.gz");
    files.push_back("share/doc/" + package + "/copyright");
    files.push_back("share/lintian/overrides/" + package);
    return files;
}

std::vector<std::string> sorted(std::vector<std::string> names)
{
    std::sort(names.begin(), names.end());
    return names;
}

/// The headers of a folder of the sources, as they are installed.
std::vector<std::string> headersOf(const std::string &folder, const std::string &installed)
{
    std::vector<std::string> names;
    for (const auto &name : filesBelow(VCLINK_SOURCE_FOLDER "/" + folder))
    {
        names.push_back(installed + name);
    }
    return names;
}

std::vector<std::string> developmentFiles(const std::string &package)
{
    const std::string configuration = libraries + "/cmake/" + package + "/" + package;
    return {libraries + "/lib" + package + ".so",
            libraries + "/pkgconfig/" + package + ".pc",
            configuration + "Config.cmake",
            configuration + "ConfigVersion.cmake",
            configuration + "Targets.cmake",
            configuration + "Targets-" VCLINK_CONFIGURATION ".cmake"};
}

class Component : public InstalledFixture
{
  protected:
    std::vector<std::string> filesOf(const std::string &component) const
    {
        install(folder() / "prefix", {component});
        return filesBelow(folder() / "prefix");
    }
};

TEST_F(Component, RuntimeIsTheLibraryAlone)
{
    EXPECT_THAT(filesOf("runtime"),
                ElementsAreArray(sorted(with({libraries + "/libvclink_git.so." + version,
                                              libraries + "/libvclink_git.so." VCLINK_SO_VERSION},
                                             "libvclink-git" VCLINK_SO_VERSION))));
    EXPECT_EQ(std::filesystem::read_symlink(folder() / "prefix" / libraries /
                                            "libvclink_git.so." VCLINK_SO_VERSION),
              "libvclink_git.so." + version);
}

TEST_F(Component, DevelopmentIsTheExportedHeadersWhatFindsTheLibraryAndTheDocuments)
{
    auto expected = headersOf("include", "include/");
    for (const auto &name : developmentFiles("vclink_git"))
    {
        expected.push_back(name);
    }
    const std::string documents = "share/doc/libvclink-git-dev/";
    for (const auto *name : {"CHANGELOG.md", "README.md", "SECURITY.md", "examples/hostTools.hpp"})
    {
        expected.push_back(documents + name);
    }
    for (const std::string example : {"desktop", "embed", "integrating"})
    {
        for (const auto &name : filesBelow(VCLINK_SOURCE_FOLDER "/examples/" + example))
        {
            expected.push_back(documents + "examples/" + example + "/" + name);
        }
    }
    for (const auto &name : filesBelow(VCLINK_SOURCE_FOLDER "/docs"))
    {
        const auto extension = std::filesystem::path(name).extension();
        if (extension == ".md" || extension == ".png" || extension == ".svg")
        {
            expected.push_back(documents + "docs/" + name);
        }
    }
    auto files = filesOf("development");
    const auto isPage = [](const std::string &name)
    { return name.rfind("share/doc/libvclink-git-dev/api/", 0) == 0; };
    files.erase(std::remove_if(files.begin(), files.end(), isPage), files.end());
    EXPECT_THAT(files, ElementsAreArray(sorted(with(expected, "libvclink-git-dev"))));
}

/// They are only there if Doxygen is.
TEST_F(Component, DevelopmentHasPagesOfTheExportedHeaders)
{
    const auto files = filesOf("development");
    const auto has = [&files](const std::string &page) {
        return std::count(files.begin(), files.end(), "share/doc/libvclink-git-dev/api/" + page) ==
               1;
    };
#ifdef VCLINK_HAS_API_PAGES
    constexpr bool isExpected = true;
#else
    constexpr bool isExpected = false;
#endif
    EXPECT_EQ(has("index.html"), isExpected);
    EXPECT_EQ(has("classvclink_1_1git_1_1BranchManager.html"), isExpected);
    EXPECT_FALSE(has("jquery.js"));
}

TEST_F(Component, DevelopmentHasDocumentsWhoseLinksLeadToInstalledFiles)
{
    const std::regex link("\\]\\(([^)#:]+)[)#]");
    std::vector<std::string> missing;
    std::size_t count = 0;
    for (const auto &name : filesOf("development"))
    {
        const std::filesystem::path page = folder() / "prefix" / name;
        if (page.extension() != ".md")
        {
            continue;
        }
        const std::string text = readFile(page);
        for (std::sregex_iterator found(text.begin(), text.end(), link), end; found != end; ++found)
        {
            const std::string target = (*found)[1];
            ++count;
            if (!std::filesystem::exists(page.parent_path() / target))
            {
                missing.push_back(name + ": " + target);
            }
        }
    }
    EXPECT_THAT(missing, testing::IsEmpty());
    EXPECT_GT(count, 100U);
}

TEST_F(Component, HostRuntimeIsTheStandInWithItsCatalogueAndLaunchers)
{
    const std::string launchers = "bin/lnxhost/";
    const std::string library = libraries + "/libvclink_host.so.";
    EXPECT_THAT(filesOf("host-runtime"),
                ElementsAreArray(sorted(
                    with({launchers + "vkAutoMerge.sh", launchers + "vkDiff", launchers + "vkMerge",
                          library + version, library + VCLINK_SO_VERSION,
                          "share/locale/de/LC_MESSAGES/vclink_git.mo",
                          "share/locale/ja/LC_MESSAGES/vclink_git.mo"},
                         "libvclink-host" VCLINK_SO_VERSION))));
}

TEST_F(Component, HostDevelopmentIsTheHeadersOfTheStandIn)
{
    auto expected = headersOf("host/include", "include/vclink_host/");
    for (const auto &name : developmentFiles("vclink_host"))
    {
        expected.push_back(name);
    }
    EXPECT_THAT(filesOf("host-development"),
                ElementsAreArray(sorted(with(expected, "libvclink-host-dev"))));
}

TEST_F(Component, ShellIsTheProgramItsManualAndItsCompletions)
{
    EXPECT_THAT(filesOf("shell"), ElementsAreArray(sorted(
                                      with({"bin/vclink-shell", "share/man/man1/vclink-shell.1.gz",
                                            "share/bash-completion/completions/vclink-shell",
                                            "share/zsh/vendor-completions/_vclink-shell"},
                                           "vclink-shell"))));
}

TEST_F(Component, ShellRunsFromWhereverItIsInstalled)
{
    install(folder() / "first", {"runtime", "host-runtime", "shell"});
    std::filesystem::rename(folder() / "first", folder() / "second");
    const auto repository = makeWorkingCopy();
    const Command status({(folder() / "second" / "bin" / "vclink-shell").string(), "-C",
                          repository.path().string(), "status"});
    EXPECT_THAT(runToSuccess(status), HasSubstr("modified\tmodified.txt\n"));
}

TEST_F(Component, ShellTellsFailuresInTheInstalledLanguages)
{
    install(folder() / "first", {"runtime", "host-runtime", "shell"});
    std::filesystem::rename(folder() / "first", folder() / "second");
    std::filesystem::create_directory(folder() / "broken");
    std::ofstream(folder() / "broken" / ".git") << "no link to a repository\n";
    const auto say = [&](const std::string &language)
    {
        return Command({(folder() / "second" / "bin" / "vclink-shell").string(), "--lang", language,
                        "-C", (folder() / "broken").string(), "status"})
            .run()
            .errors;
    };
    EXPECT_THAT(say("en"), HasSubstr("Git could not complete the operation"));
    EXPECT_THAT(say("de"), Not(HasSubstr("Git could not complete the operation")));
    EXPECT_THAT(say("de"), HasSubstr(".git"));
}

TEST_F(Component, NoneTellsWhereItWasBuiltOrInstalled)
{
    const auto prefix = installAndMove();
    install(prefix, {"shell"});
    for (const auto &name : filesBelow(prefix))
    {
        const std::string bytes = readFile(prefix / name);
        EXPECT_EQ(bytes.find(VCLINK_BUILD_FOLDER), std::string::npos) << name;
        EXPECT_EQ(bytes.find(VCLINK_SOURCE_FOLDER), std::string::npos) << name;
        EXPECT_EQ(bytes.find((folder() / "first").string()), std::string::npos) << name;
    }
}

} // namespace
