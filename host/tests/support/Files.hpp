// SPDX-License-Identifier: MIT
#pragma once

#include <cstdlib>
#include <fstream>
#include <optional>
#include <string>

#include "fl/filesystem/path.hpp"
#include "fl/i18n/convert.hpp"
#include "support/TemporaryFolder.hpp"
#include "support/readFile.hpp"

namespace vclink_host_tests
{

/// A fresh folder, with the paths of its entries as the host takes them.
class Folder : public vclink::test::TemporaryFolder
{
  public:
    std::string file(const std::string &name) const
    {
        return path() / name;
    }
    ustring ufile(const std::string &name) const
    {
        return fl::i18n::utf8_to_ustring(path().string() + '/' + name);
    }
    upath operator()(const std::string &name) const
    {
        return upath(ufile(name));
    }
    void write(const std::string &name, const std::string &content) const
    {
        std::ofstream(path() / name, std::ios_base::binary) << content;
    }
    std::string read(const std::string &name) const
    {
        return vclink::test::readFile(path() / name);
    }
};

/// Sets an environment variable for the object's life.
class ScopedVariable
{
  public:
    ScopedVariable(const char *name, const char *value) : name_(name)
    {
        if (const char *const before = std::getenv(name))
            before_ = before;
        ::setenv(name, value, 1);
    }
    ScopedVariable(const ScopedVariable &) = delete;
    ScopedVariable &operator=(const ScopedVariable &) = delete;
    ~ScopedVariable()
    {
        if (before_)
            ::setenv(name_, before_->c_str(), 1);
        else
            ::unsetenv(name_);
    }

  private:
    const char *const name_;
    std::optional<std::string> before_;
};

} // namespace vclink_host_tests
