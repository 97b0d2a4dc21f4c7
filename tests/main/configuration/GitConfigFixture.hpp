// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <functional>
#include <map>
#include <optional>
#include <string>

#include "fl/ustring.hpp"
#include "main/branches/BranchFixture.hpp"
#include "support/GitFixture.hpp"
#include "support/LibGit2Session.hpp"
#include "vclink/git/GitConfig.hpp"

namespace vclink::test
{

/// Sets the place of installation for the life of the object.
class InstallPath
{
  public:
    explicit InstallPath(const std::string &folder);
    InstallPath(const InstallPath &) = delete;
    InstallPath &operator=(const InstallPath &) = delete;
    ~InstallPath();

  private:
    ustring before_;
};

/// A value as bytes; "no value" where there is none.
std::string shown(const std::optional<ustring> &value);

/// Base of the fixtures whose tests read and write the user's configuration.
class GitConfigFixture : public GitFixture
{
  protected:
    /// The user's file in the home folder.
    std::filesystem::path global() const
    {
        return environment().home() / ".gitconfig";
    }
    /// The user's file in the XDG folder.
    std::filesystem::path xdg() const
    {
        return environment().home() / ".config/git/config";
    }
    static std::string read(const std::filesystem::path &file);
    /// Makes the folders above the file, too.
    static void writeFile(const std::filesystem::path &file, const std::string &bytes);
    /// What git finds for a key, the user's files only.
    std::string byGit(const std::string &key) const;
    /// The result of `action` in a separate process, in which libgit2 starts again, with this
    /// environment; an empty value means no variable.
    std::string runIn(const std::map<std::string, std::string> &environment,
                      const std::function<std::string()> &action) const;

    LibGit2Session session_{environment()};
};

} // namespace vclink::test
