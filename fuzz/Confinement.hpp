// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

namespace vclink::fuzz
{

/// While it lives, this process changes files in the given folders only, starts no other process
/// and talks to no network: what would is refused, and a change elsewhere is remembered. It stands
/// in for the functions of the C library by which libgit2 and this library do so; a program that
/// links it has these replaced. For one thread, and one object at a time.
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
