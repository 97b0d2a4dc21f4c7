// SPDX-License-Identifier: MIT
#include "GitServer.hpp"

namespace vclink::test
{

GitServer::GitServer()
{
    std::filesystem::create_directory(repositories());
}

GitServer::~GitServer() = default;

GitRepository GitServer::makeRepository()
{
    const std::string name = "repository" + std::to_string(++repositoryCount_) + ".git";
    GitRepository(repositories())
        .git({"init", "--quiet", "--bare", "--template=", "--initial-branch=main", name});
    GitRepository repository(repositories() / name);
    repository.git({"config", "http.receivepack", "true"});
    // Nothing goes on in the repository when a push has ended.
    repository.git({"config", "receive.autogc", "false"});
    return repository;
}

std::string GitServer::url(const GitRepository &repository) const
{
    return base() + "/" + repository.path().filename().string();
}

void GitServer::prepareClient() const
{
}

std::string PathServer::base() const
{
    return repositories();
}

std::string FileServer::base() const
{
    return "file://" + repositories().string();
}

} // namespace vclink::test
