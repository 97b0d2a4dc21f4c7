// SPDX-License-Identifier: MIT
#include "CommitFixture.hpp"

#include "support/Failure.hpp"
#include "support/UnprivilegedUser.hpp"

namespace vclink::test
{

CommitFixture::CommitFixture()
{
    configureIdentity(repository_);
}

void CommitFixture::configureIdentity(const GitRepository &repository)
{
    repository.identify("Test Person", "person@example.com");
}

void CommitFixture::commit(const std::string &message) const
{
    commitIn(repository_, message);
}

void CommitFixture::commitIn(const GitRepository &repository, const std::string &message) const
{
    makeAdapter(repository.path())->commit(upath(), asUtf16(message));
}

void CommitFixture::giveAway() const
{
    // Otherwise git refuses to look at what another user owns.
    GitRepository(environment().home()).write(".gitconfig", "[safe]\n\tdirectory = *\n");
    giveToUnprivilegedUser(repository_.path());
}

std::string CommitFixture::commitAsItsOwner() const
{
    return runAsUnprivilegedUser(
        [this]
        {
            const auto failure = failureIfAny([this] { commit(); });
            return failure ? std::to_string(failure->code) + ' ' +
                                 std::to_string(failure->errorClass) + ' ' + failure->text
                           : "committed";
        });
}

std::vector<std::string> CommitFixture::namesIn(const std::string &commit) const
{
    return split(repository_.git({"ls-tree", "-r", "--name-only", commit}));
}

std::string CommitFixture::committed(const std::string &name) const
{
    return repository_.git({"cat-file", "blob", "HEAD:" + name});
}

std::vector<std::string> CommitFixture::parents() const
{
    return split(repository_.git({"rev-parse", "HEAD^@"}));
}

std::string CommitFixture::idOf(const std::string &name) const
{
    return repository_.line({"rev-parse", "--verify", name});
}

} // namespace vclink::test
