// SPDX-License-Identifier: MIT
#include "GitServer.hpp"

#include <fstream>
#include <system_error>
#include <utility>

namespace vclink::test
{

ScopedFile::ScopedFile(std::filesystem::path file, const std::string &text) : file_(std::move(file))
{
    std::ofstream(file_) << text << std::flush;
}

ScopedFile::~ScopedFile()
{
    std::error_code ignored;
    std::filesystem::remove(file_, ignored);
}

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

ScopedFile GitServer::writeSettings(const std::string &text) const
{
    return {folder() / ".gitconfig", text};
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
