// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <string>

#include "fl/ustring.hpp"

namespace vclink_host_tests
{

/// A fresh folder that is gone with all it holds when the object ends.
class TemporaryFolder
{
  public:
    TemporaryFolder();
    TemporaryFolder(const TemporaryFolder &) = delete;
    TemporaryFolder &operator=(const TemporaryFolder &) = delete;
    ~TemporaryFolder();

    const std::string &path() const noexcept
    {
        return path_;
    }
    /// The path of `name` in it.
    std::string file(const std::string &name) const;
    /// The same as the host's text.
    ustring ufile(const std::string &name) const;

  private:
    std::string path_;
};

/// The bytes of a file; empty when it can't be read.
std::string readFile(const std::string &path);
void writeFile(const std::string &path, const std::string &content);

/// Runs the check in a child process that has no privileges, whoever runs the tests.
/// @return whether the check ran to its end and gave true
bool checkAsUnprivilegedUser(const std::function<bool()> &check);

/// Sets an environment variable for the object's life.
class ScopedVariable
{
  public:
    ScopedVariable(const char *name, const char *value);
    ScopedVariable(const ScopedVariable &) = delete;
    ScopedVariable &operator=(const ScopedVariable &) = delete;
    ~ScopedVariable();

  private:
    std::string name_;
    bool wasSet_;
    std::string before_;
};

} // namespace vclink_host_tests
