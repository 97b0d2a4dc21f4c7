// SPDX-License-Identifier: MIT
#include "RemoteFixture.hpp"

#include <algorithm>
#include <filesystem>
#include <iterator>
#include <typeinfo>

#include <gtest/gtest.h>

#include "error/errorUtil/callbackException.hpp"
#include "support/Descriptors.hpp"
#include "support/text.hpp"
#include "vclink/util/exception/CancelledOperationException.hpp"

namespace vclink::test
{
namespace
{

std::vector<ustring> asTexts(const std::vector<std::string> &texts)
{
    std::vector<ustring> wide;
    std::transform(texts.begin(), texts.end(), std::back_inserter(wide), asUtf16);
    return wide;
}

} // namespace

RemoteFixture::RemoteFixture(Naming naming) : naming_(naming)
{
    std::filesystem::create_directory(server_.path());
    server_.git({"init", "--quiet", "--bare", "--initial-branch=main"});
    author_.git({"remote", "add", "server", server_.path().string()});
    publish("file", "of the author\n");
    repository_.git({"remote", "add", "origin", nameOf(server_)});
}

std::string RemoteFixture::nameOf(const GitRepository &repository) const
{
    return (naming_ == Naming::FileUrl ? "file://" : "") + repository.path().string();
}

void RemoteFixture::fetch(const std::vector<std::string> &refspecs) const
{
    remote().fetch(asTexts(refspecs));
}

void RemoteFixture::push(const std::vector<std::string> &refspecs) const
{
    remote().push(asTexts(refspecs));
}

std::string RemoteFixture::publish(const std::string &name, const std::string &bytes)
{
    author_.write(name, bytes);
    const std::string id = author_.commitAll("of the author: " + name);
    author_.git({"push", "--quiet", "--force", "server", "HEAD"});
    return id;
}

std::string RemoteFixture::commit(const std::string &name, const std::string &bytes)
{
    repository_.write(name, bytes);
    return repository_.commitAll("of the working copy: " + name);
}

std::vector<std::string> RemoteFixture::references(const GitRepository &repository)
{
    return split(repository.git({"for-each-ref", "--format=%(refname) %(objectname) %(symref)"}));
}

GitRepository RemoteFixture::twin() const
{
    return repository_.copyTo(folder() / "twin");
}

} // namespace vclink::test
