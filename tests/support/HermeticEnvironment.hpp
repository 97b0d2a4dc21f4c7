// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <string>
#include <vector>

namespace vclink::test
{

/// Sets the process's environment so that neither Git nor libgit2 finds anything of the person who
/// runs the tests, and restores the whole environment at the end, whatever has changed.
///
/// HOME, the XDG folders and TMPDIR lie in a given folder; there is no identity, no variable of
/// Git's own but GIT_CONFIG_NOSYSTEM, GIT_TERMINAL_PROMPT and GIT_EDITOR, no USER, LOGNAME, ssh
/// agent or proxy; the locale is C.UTF-8.
///
/// libgit2 remembers where it looks for configuration from its first start to its last shutdown. If
/// it runs already, this object sets the new places (and the old ones at the end). If it starts
/// later, it finds them in the environment, except the system's configuration, for which it has no
/// variable: see isolateLibGit2().
class HermeticEnvironment
{
  public:
    /// @param folder must exist and outlive the object
    explicit HermeticEnvironment(const std::filesystem::path &folder);
    HermeticEnvironment(const HermeticEnvironment &) = delete;
    HermeticEnvironment &operator=(const HermeticEnvironment &) = delete;
    ~HermeticEnvironment();

    const std::filesystem::path &home() const noexcept
    {
        return home_;
    }
    /// What TMPDIR names; every user may write there.
    const std::filesystem::path &temporary() const noexcept
    {
        return temporary_;
    }

    /// Lets a running libgit2 look for configuration below home() only, the system's level being an
    /// empty folder. Has no effect when libgit2 does not run.
    void isolateLibGit2() const;

  private:
    std::vector<std::string> saved_;
    std::filesystem::path home_;
    std::filesystem::path temporary_;
    std::filesystem::path system_;
};

} // namespace vclink::test
