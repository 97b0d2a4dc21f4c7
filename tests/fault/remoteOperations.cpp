// SPDX-License-Identifier: MIT
#include "Operation.hpp"
#include "repositories.hpp"
#include "support/text.hpp"
#include "vclink/git/GitAdapterFactory.hpp"
#include "vclink/git/GitRemote.hpp"
#include "vclink/git/GitRemoteHead.hpp"

namespace vclink::test
{
namespace
{

using git::GitRemote;

std::shared_ptr<GitRemote> makeOrigin(const Subject &subject)
{
    return GitRemote::create("origin", *subject.adapter);
}

Action fetch(const Subject &subject)
{
    return [remote = makeOrigin(subject), adapter = subject.adapter]
    {
        remote->fetch({});
        return std::string();
    };
}

Action fetchIntoBranch(const Subject &subject)
{
    return [remote = makeOrigin(subject), adapter = subject.adapter]
    {
        remote->fetch({u"refs/heads/main:refs/heads/copy"});
        return std::string();
    };
}

Action push(const Subject &subject)
{
    return [remote = makeOrigin(subject), adapter = subject.adapter]
    {
        remote->push({u"refs/heads/main:refs/heads/ours"});
        return std::string();
    };
}

Action pushTagAndBranch(const Subject &subject)
{
    return [remote = makeOrigin(subject), adapter = subject.adapter]
    {
        remote->push({u"refs/tags/v1", u"+refs/heads/main:refs/heads/kept"});
        return std::string();
    };
}

Action getRemoteHeads(const Subject &subject)
{
    return [remote = makeOrigin(subject), adapter = subject.adapter]
    {
        std::string names;
        for (const auto &head : remote->getRemoteHeads())
            names += head.name + ' ';
        return names;
    };
}

/// Clones the remote into the working copy, where git can clear it away.
Action generate(const Subject &subject)
{
    const std::shared_ptr<WorkingCopyGenerator> generator =
        git::GitAdapterFactory().createWorkingCopyGenerator(subject.interactor);
    const auto origin = subject.repository.path().parent_path() / "origin";
    return [=, specifier = asUtf16(origin.string()), folder = subject.pathOf("clone")]
    {
        generator->generate(specifier, folder);
        return std::string();
    };
}

} // namespace

std::vector<Operation> remoteOperations()
{
    return {
        {"fetch", makeRemote, fetch},
        {"fetchGuarded", makeGuardedFetch, fetchIntoBranch},
        {"push", makeRemote, push},
        {"pushGuarded", makeGuardedPush, pushTagAndBranch},
        {"getRemoteHeads", makeRemote, getRemoteHeads, "", {}, false},
        {"generate",
         makeRemote,
         generate,
         "vclink::git::LibGit2Exception",
         {{"clean", "--quiet", "-ffd"}}},
    };
}

} // namespace vclink::test
