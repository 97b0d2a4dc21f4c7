// SPDX-License-Identifier: MIT
// What a clone is made of and where it goes.
#include <filesystem>
#include <string>
#include <vector>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "CloneFixture.hpp"
#include "error/logging/severity.hpp"
#include "support/LogCapture.hpp"
#include "support/UnprivilegedUser.hpp"
#include "support/WorkingFolder.hpp"
#include "support/libgit2Release.hpp"
#include "vclink/git/LibGit2Exception.hpp"

namespace
{

namespace git = vclink::git;
using namespace vclink::test;

const std::string eastern = "\xE6\x9D\xB1\xE4\xBA\xAC gr\xC3\xBC\xC3\x9F";

class CloneSpecifier : public CloneFixture
{
  protected:
    CloneSpecifier() : CloneFixture(Naming::PlainPath)
    {
    }

    GitRepository serverNamed(const std::string &name) const
    {
        std::filesystem::copy(server_.path(), folder() / name,
                              std::filesystem::copy_options::recursive);
        return GitRepository(folder() / name);
    }
    /// Nothing is made then.
    Failure failureOfClone(const std::string &specifier) const
    {
        auto failure = failureOf([&] { generate(specifier, clone_.path()); });
        EXPECT_FALSE(std::filesystem::exists(clone_.path())) << specifier;
        return failure;
    }
};

class CloneTarget : public CloneSpecifier
{
  protected:
    /// The names in the target, which stays a folder.
    std::vector<std::string> names() const
    {
        std::vector<std::string> found;
        for (const auto &entry : std::filesystem::directory_iterator(clone_.path()))
            found.push_back(entry.path().filename());
        return found;
    }
};

TEST_F(CloneSpecifier, GoesToLibGit2AsUtf8)
{
    const auto server = serverNamed(eastern);
    const LogCapture log(git::SeverityParameter);
    generate(server.path(), folder() / ("clone " + eastern));
    const GitRepository clone(folder() / ("clone " + eastern));
    expectCloned(clone);
    EXPECT_EQ(clone.line({"config", "remote.origin.url"}), server.path().string());
    EXPECT_EQ(log.messages().front(), " repositorySpecifier=" + server.path().string() +
                                          " sandboxRoot.string()=" + clone.path().string());
}

TEST_F(CloneSpecifier, MayHaveBlanksAndEscapesInAUrl)
{
    serverNamed("with blanks %25");
    generate("file://" + (folder() / "with%20blanks%20%2525").string(), clone_.path());
    expectCloned(clone_);
}

TEST_F(CloneSpecifier, MayBeRelativeToTheWorkingFolder)
{
    const WorkingFolder here(folder().path());
    for (const std::string name :
         {"server", "./server", "author/../server", "author", author_.path().c_str()})
    {
        generate(name, "relative/clone");
        expectCloned(GitRepository(folder() / "relative/clone"));
        std::filesystem::remove_all(folder() / "relative");
    }
}

TEST_F(CloneSpecifier, OfNoRepositoryFailsAndLeavesTheGeneratorAsItWas)
{
    std::filesystem::create_directory(folder() / "plain");
    const std::string url = "file://" + folder().path().string();
    EXPECT_EQ(failureOfClone(folder() / "plain").code, GIT_ENOTFOUND);
    for (const std::string &specifier :
         {url + "/plain", (folder() / "missing").string(), url + "/missing", std::string()})
    {
        const auto failure = failureOfClone(specifier);
        EXPECT_LT(failure.code, 0) << specifier;
        EXPECT_NE(failure.text, "") << specifier;
    }
    EXPECT_THAT(failureOfClone("nonsense://host/path").text,
                testing::HasSubstr(libgit2_release::refusalOfScheme("nonsense://host/path")));
    generate();
    expectCloned(clone_);
}

TEST_F(CloneTarget, MayLieInFoldersThatAreMissing)
{
    generate(nameOf(server_), folder() / "a/b/c");
    expectCloned(GitRepository(folder() / "a/b/c"));
}

TEST_F(CloneTarget, IsAFailureWhenItIsNotEmptyOrAFileOrHasNoName)
{
    clone_.write("mine", "x");
    const auto failure = failureOf([this] { generate(); });
    EXPECT_EQ(failure,
              (Failure{GIT_EEXISTS, GIT_ERROR_INVALID,
                       "'" + clone_.path().string() + "' exists and is not an empty directory"}));
    EXPECT_THAT(names(), testing::ElementsAre("mine"));
    EXPECT_EQ(failureOf([&] { generate(nameOf(server_), clone_ / "mine"); }).code, GIT_EEXISTS);
    EXPECT_EQ(clone_.read("mine"), "x");
    EXPECT_LT(failureOf([this] { generate(nameOf(server_), ""); }).code, 0);
}

TEST_F(CloneTarget, ThatWasThereAndEmptyStaysSoAfterAFailure)
{
    std::filesystem::create_directory(clone_.path());
    failureOf([this] { generate(folder() / "missing", clone_.path()); });
    ASSERT_TRUE(std::filesystem::is_directory(clone_.path()));
    EXPECT_THAT(names(), testing::IsEmpty());
    generate();
    expectCloned(clone_);
}

TEST_F(CloneTarget, ThatMayNotBeWrittenFails)
{
    std::filesystem::create_directory(folder() / "closed");
    std::filesystem::permissions(folder() / "closed", std::filesystem::perms(0555));
    for (const auto &entered : {environment().home(), server_.path()})
        std::filesystem::permissions(entered, std::filesystem::perms(0755));
    const std::string outcome = runAsUnprivilegedUser(
        [this]() -> std::string
        {
            try
            {
                const auto fresh = git::GitAdapterFactory().createWorkingCopyGenerator(interactor_);
                fresh->generate(asUtf16("file://" + server_.path().string()),
                                asPath((folder() / "closed/clone").string()));
                return "cloned";
            }
            catch (const git::LibGit2Exception &exception)
            {
                const auto &error = exception.getError();
                return std::to_string(error.getErrorClass()) + ' ' + asUtf8(error.getMessage());
            }
        });
    EXPECT_THAT(outcome, testing::StartsWith(std::to_string(int{GIT_ERROR_OS}) + ' '));
    EXPECT_THAT(outcome, testing::HasSubstr("Permission denied"));
    EXPECT_TRUE(std::filesystem::is_empty(folder() / "closed"));
}

} // namespace
