// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

#include "StagingFixture.hpp"
#include "support/strings.hpp"

namespace vclink::test
{

/// Base of the fixtures whose tests commit: a repository with the committed files "file", "other"
/// and "sub/inside", and a configured identity, "Test Person" at "person@example.com". Each commit
/// is made by an adapter of its own.
class CommitFixture : public StagingFixture
{
  protected:
    CommitFixture();

    /// Configures the identity in a working copy other than the fixture's own.
    static void configureIdentity(const GitRepository &repository);

    void commit(const std::string &message = "message") const;
    /// commit(), in a working copy other than the fixture's own.
    void commitIn(const GitRepository &repository, const std::string &message = "message") const;

    /// Hands the repository to the unprivileged user. git may still be run on it.
    void giveAway() const;
    /// What commit() comes to when that user calls it: "committed", or the LibGit2Exception's code,
    /// class and text.
    std::string commitAsItsOwner() const;

    /// The names in a commit's tree.
    std::vector<std::string> namesIn(const std::string &commit = "HEAD") const;
    /// The content of a file in the commit at HEAD.
    std::string committed(const std::string &name) const;
    /// The ids of the parents of the commit at HEAD, in order.
    std::vector<std::string> parents() const;
    std::string idOf(const std::string &name) const;
};

} // namespace vclink::test
