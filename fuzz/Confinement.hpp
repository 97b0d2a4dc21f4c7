// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

namespace vclink::fuzz
{

/// While it lives, this process changes files only in the given folders, starts no other process
/// and uses no network: other calls are refused, and a change elsewhere is remembered. It replaces
/// the functions of the C library that libgit2 and this library use for that, in every program that
/// links it. For one thread, and one object at a time.
class Confinement
{
  public:
    /// @param folders absolute and free of symbolic links
    explicit Confinement(std::vector<std::string> folders);
    Confinement(const Confinement &) = delete;
    Confinement &operator=(const Confinement &) = delete;
    ~Confinement();

    /// The first change outside the folders since the last look, function and path; empty when
    /// there was none.
    std::string takeTrespass();
};

} // namespace vclink::fuzz
