// SPDX-License-Identifier: MIT
#include "RemoteFixture.hpp"

#include <utility>

#include "support/adapterFor.hpp"
#include "support/text.hpp"
#include "vclink/git/GitAdapterFactory.hpp"

namespace vclink::test
{
namespace
{

std::vector<ustring> asTexts(const std::vector<std::string> &texts)
{
    std::vector<ustring> converted;
    for (const auto &text : texts)
        converted.push_back(asUtf16(text));
    return converted;
}

} // namespace

std::string referencesOf(const GitRepository &repository)
{
    return repository.git({"for-each-ref", "--format=%(refname) %(objectname) %(symref)"});
}

std::unique_ptr<WorkingCopyGenerator> RemoteFixture::makeGenerator() const
{
    return git::GitAdapterFactory().createWorkingCopyGenerator(interactor_);
}

std::unique_ptr<CMAdapter> RemoteFixture::makeAdapter(const GitRepository &repository) const
{
    return adapterFor(repository, interactor_);
}

GitRepository RemoteFixture::clone(const std::string &url, const std::string &name) const
{
    makeGenerator()->generate(asUtf16(url), asPath(folder() / name));
    return GitRepository(folder() / name);
}

void RemoteFixture::fetch(const GitRepository &repository,
                          const std::vector<std::string> &refspecs) const
{
    const auto adapter = makeAdapter(repository);
    git::GitRemote::create("origin", *adapter)->fetch(asTexts(refspecs));
}

void RemoteFixture::push(const GitRepository &repository,
                         const std::vector<std::string> &refspecs) const
{
    const auto adapter = makeAdapter(repository);
    git::GitRemote::create("origin", *adapter)->push(asTexts(refspecs));
}

std::vector<git::GitRemoteHead> RemoteFixture::heads(const GitRepository &repository) const
{
    const auto adapter = makeAdapter(repository);
    return git::GitRemote::create("origin", *adapter)->getRemoteHeads();
}

void RemoteFixture::expectSound(const GitRepository &repository)
{
    const auto check = repository.tryGit({"fsck", "--strict", "--no-dangling"});
    EXPECT_TRUE(check.succeeded()) << check.errors;
    EXPECT_EQ(repository.git({"status", "--porcelain"}), "");
}

} // namespace vclink::test
