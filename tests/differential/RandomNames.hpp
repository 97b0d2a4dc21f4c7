// SPDX-License-Identifier: MIT
#pragma once

#include <set>
#include <string>
#include <vector>

#include "Random.hpp"

namespace vclink::test
{

/// Makes paths of files, relative and with slashes. Most are names that people use; the others
/// contain everything that a name can: blanks and line ends in any place, special characters of
/// shells, patterns and configuration files, text outside ASCII, bytes that are not UTF-8.
class RandomNames
{
  public:
    explicit RandomNames(Random &random) : random_(random)
    {
    }

    /// A path that was not given out yet, and that is no folder of one that was, nor lies below
    /// one.
    std::string fresh();
    /// As fresh(), in this folder; the empty text is the root.
    std::string freshIn(const std::string &folder);
    /// A folder in which nothing was given out yet.
    std::string freshFolder();
    /// A folder that holds something, or the root.
    std::string someFolder();

  private:
    bool isFree(const std::string &path) const;
    void take(const std::string &path);

    Random &random_;
    std::set<std::string> files_;
    std::set<std::string> folders_;
};

} // namespace vclink::test
