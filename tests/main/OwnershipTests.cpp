// SPDX-License-Identifier: MIT
#include <filesystem>
#include <string>

#include <gtest/gtest.h>

#include "AdapterFixture.hpp"
#include "support/Failure.hpp"
#include "support/UnprivilegedUser.hpp"
#include "support/libgit2Release.hpp"
#include "support/text.hpp"
#include "vclink/git/GitAdapterFactory.hpp"

namespace
{

using namespace vclink::test;

/// A repository of whoever runs the tests, met by the unprivileged user, who is another one where
/// the tests run as root.
class Ownership : public AdapterFixture
{
  protected:
    Ownership()
    {
        repository_.write("file", "x");
        for (const auto &entered : {repository_.path(), environment().home()})
            std::filesystem::permissions(entered, std::filesystem::perms(0755));
    }

    void trust(const std::string &folders) const
    {
        GitRepository(environment().home())
            .write(".gitconfig", "[safe]\n\tdirectory = " + folders + "\n");
    }

    /// What the first operation comes to: the failure, or the number of states.
    std::string openedByTheOther() const
    {
        return runAsUnprivilegedUser(
            [this]
            {
                std::size_t count = 0;
                const auto failure = failureIfAny([&] { count = allStates(repository_).size(); });
                return failure ? printed(*failure) : std::to_string(count) + " states";
            });
    }
    std::string notOwned() const
    {
        return "code -36, class 7: repository path '" + repository_.path().string() +
               std::string(libgit2_release::endOfOwnedPath) + "' is not owned by current user";
    }
    static std::string unlessOwn(const std::string &refused)
    {
        return runsAsRoot() ? refused : "1 states";
    }

    GitRepository repository_ = makeRepository();
};

TEST_F(Ownership, OfAnotherUserRefusesTheFirstOperation)
{
    EXPECT_EQ(openedByTheOther(),
              unlessOwn(libgit2_release::needsNoSafeDirectory
                            ? notOwned()
                            : "code -3, class 7: config value 'safe.directory' was not found"));
}

TEST_F(Ownership, OfAnotherUserIsNamedWhereOtherFoldersAreTrusted)
{
    trust("/another/folder");
    EXPECT_EQ(openedByTheOther(), unlessOwn(notOwned()));
}

TEST_F(Ownership, OfAnotherUserDoesNotMatterForATrustedFolder)
{
    trust(repository_.path());
    EXPECT_EQ(openedByTheOther(), "1 states");
}

/// git takes a star for every folder, libgit2 does so in later releases.
TEST_F(Ownership, OfAnotherUserIsTrustedByAStarWhereLibGit2Knows)
{
    trust("*");
    EXPECT_EQ(openedByTheOther(), libgit2_release::trustsStar ? "1 states" : unlessOwn(notOwned()));
}

/// A probe looks at the layout only.
TEST_F(Ownership, OfAnotherUserIsNotSeenByAProbe)
{
    const auto probe = [this]
    {
        const upath root = asPath(repository_.path());
        return vclink::git::GitAdapterFactory().isAdapterFor(root) ? "true" : "false";
    };
    EXPECT_EQ(runAsUnprivilegedUser(probe), "true");
    trust("/another/folder");
    EXPECT_EQ(runAsUnprivilegedUser(probe), "true");
}

TEST_F(Ownership, IsFineForTheOneWhoOwnsTheRepository)
{
    giveToUnprivilegedUser(repository_.path());
    EXPECT_EQ(openedByTheOther(), "1 states");
}

} // namespace
