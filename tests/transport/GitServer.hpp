// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <memory>
#include <string>

#include "support/GitRepository.hpp"
#include "support/TemporaryFolder.hpp"

namespace vclink::test
{

/// A file that is removed at the end.
class ScopedFile
{
  public:
    ScopedFile(std::filesystem::path file, const std::string &text);
    ScopedFile(const ScopedFile &) = delete;
    ScopedFile &operator=(const ScopedFile &) = delete;
    ~ScopedFile();

  private:
    std::filesystem::path file_;
};

/// A place that repositories are cloned from and pushed to. It lives as long as a suite of tests.
class GitServer
{
  public:
    GitServer();
    GitServer(const GitServer &) = delete;
    GitServer &operator=(const GitServer &) = delete;
    virtual ~GitServer();

    /// A new bare repository, empty, with the branch "main" to come, which takes pushes. The names
    /// of a server's repositories are all different.
    GitRepository makeRepository();

    /// What a client calls the repository.
    std::string url(const GitRepository &repository) const;
    /// What all of the server's addresses begin with.
    virtual std::string base() const = 0;

    /// Gives the server's programs a configuration, until the object ends.
    ScopedFile writeSettings(const std::string &text) const;

    /// Sets the variables that git needs to get in, which libgit2 does not read, and the agent's
    /// for both. To be called in a hermetic environment.
    virtual void prepareClient() const;

  protected:
    /// Where the server's own files are.
    const std::filesystem::path &folder() const noexcept
    {
        return folder_.path();
    }
    /// Where the repositories are.
    std::filesystem::path repositories() const
    {
        return folder_ / "repositories";
    }

  private:
    TemporaryFolder folder_;
    int repositoryCount_ = 0;
};

/// No server at all: a plain path.
class PathServer : public GitServer
{
  public:
    std::string base() const override;
};

/// No server either, but a URL.
class FileServer : public GitServer
{
  public:
    std::string base() const override;
};

} // namespace vclink::test
