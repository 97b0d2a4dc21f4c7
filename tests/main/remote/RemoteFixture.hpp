// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "main/branches/BranchFixture.hpp"
#include "vclink/git/GitRemote.hpp"

namespace vclink::test
{

/// How a repository on this machine is named: libgit2 copies the one and talks to the other.
enum class Naming
{
    PlainPath,
    FileUrl
};

/// Base of the fixtures whose tests talk to a remote: a bare repository, "server", to which a
/// second working copy, "author", has pushed the branch "main". The working copy under test names
/// it "origin" and has fetched nothing yet.
class RemoteFixture : public BranchFixture
{
  protected:
    explicit RemoteFixture(Naming naming = Naming::FileUrl);

    using BranchFixture::idOf;
    static std::string idOf(const std::string &revision, const GitRepository &repository)
    {
        return repository.line({"rev-parse", "--verify", revision});
    }
    /// What names a repository of this machine.
    std::string nameOf(const GitRepository &repository) const;
    git::GitRemote &remote() const
    {
        return *remote_;
    }
    void fetch(const std::vector<std::string> &refspecs = {}) const;
    void push(const std::vector<std::string> &refspecs = {}) const;
    /// The author commits a file and pushes the branch that is checked out there.
    /// @return the commit's id
    std::string publish(const std::string &name, const std::string &bytes);
    /// The working copy commits a file.
    std::string commit(const std::string &name, const std::string &bytes);
    /// Every reference and its object, as git reports it.
    static std::vector<std::string> references(const GitRepository &repository);
    /// A copy of the working copy as it is now, for git to work on.
    GitRepository twin() const;

    GitRepository server_{folder() / "server"};
    GitRepository author_ = makeRepository("author");

  private:
    Naming naming_;
    const std::unique_ptr<git::GitRemote> remote_ = git::GitRemote::create("origin", *adapter_);
};

} // namespace vclink::test
