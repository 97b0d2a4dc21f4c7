// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <string>
#include <typeinfo>
#include <vector>

#include <boost/variant/get.hpp>
#include <gtest/gtest.h>

#include "error/raise.hpp"
#include "main/AdapterFixture.hpp"
#include "support/Failure.hpp"
#include "support/RepositoryState.hpp"
#include "support/text.hpp"
#include "vclink/git/messageIdentifiers.hpp"

namespace vclink::test
{

/// Expects that `action` throws exactly the class of the identifier, with a report of these paths
/// as its argument, or with none if there are none.
template <class Tag>
void expectRefusal(const std::vector<std::string> &paths, const std::function<void()> &action)
{
    ustring report;
    for (const auto &path : paths)
        report += (report.empty() ? u"" : u"\n") + asUtf16(path);
    try
    {
        action();
        ADD_FAILURE() << "no exception";
    }
    catch (const git::TagException<Tag> &exception)
    {
        const vclink::exception::SourceControlException &base = exception;
        EXPECT_EQ(typeid(base), typeid(git::TagException<Tag>));
        const auto &message = exception.GetBaseMsgIDObj();
        EXPECT_EQ(message.getCatalogue(), "shared_vclink:git");
        EXPECT_EQ(message.getArguments().size(), paths.empty() ? 0U : 1U);
        for (const auto &argument : message.getArguments())
            EXPECT_EQ(asUtf8(boost::get<ustring>(argument)), asUtf8(report));
    }
}

/// Base of the fixtures whose tests stage and throw away changes: a repository with the committed
/// files "file", "other" and "sub/inside". Each operation runs on an adapter of its own.
class StagingFixture : public AdapterFixture
{
  protected:
    StagingFixture();

    void add(const std::vector<std::string> &names) const;
    void remove(const std::vector<std::string> &names) const;
    void markResolved(const std::string &name) const;
    void revert(const std::vector<std::string> &names) const;

    /// Reverts, and expects what git makes of the same names.
    void expectRevertsAsGit(const std::vector<std::string> &names) const;

    /// The files of these names as the host would list them.
    std::vector<upath> files(const std::vector<std::string> &names) const;
    /// The names below the root, as text.
    std::vector<std::string> inRoot(const std::vector<std::string> &names) const;

    /// git's status, an entry a path.
    std::vector<std::string> status() const;
    /// What the repository would be after these commands of git, run on a copy.
    RepositoryState stateAfterGit(const std::vector<std::vector<std::string>> &commands) const;

    /// The LibGit2Exception that `action` throws in a process without privileges, as text.
    std::string unprivilegedFailureOf(const std::function<void()> &action) const;
    /// Makes the unprivileged user the owner of the test's folder, and git and libgit2 put up with
    /// it.
    void giveAway() const;

    /// Begins a merge that changes each of these on both sides and stops at the conflicts.
    void beginMerge(const std::vector<std::string> &names);

    /// Commits the submodule "module", which has the file "file" and two commits.
    void addModule();

    GitRepository repository_ = makeRepository();
};

} // namespace vclink::test
