// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

#include "Random.hpp"
#include "support/GitRepository.hpp"

namespace vclink::test
{

/// Makes the refresh of a working copy harder, by the seed alone: attributes and line ends,
/// configuration, entries that a sparse checkout leaves out or that are assumed unchanged, files
/// that only look changed or only look unchanged, files that can't be read, a file and a folder of
/// one name in the index.
class RefreshHazards
{
  public:
    RefreshHazards(Random &random, const GitRepository &repository);

    void add();

    /// What was done, a line a step.
    const std::string &script() const noexcept
    {
        return script_;
    }
    /// Whether a user without privileges fails where root does not.
    bool hasUnreadable() const noexcept
    {
        return hasUnreadable_;
    }

  private:
    void note(const std::string &line);
    void configure(const std::string &name, const std::vector<std::string> &values);
    void writeAttributes();
    void changeLineEnds(const std::string &path);
    void setFlag(const std::string &flag, unsigned percent);
    void changeTimes(const std::string &path);
    void rewriteUnseen(const std::string &path);
    void dateIndex();
    void hide(const std::string &path);
    void collide();
    bool isFile(const std::string &path) const;

    Random &random_;
    GitRepository repository_;
    std::vector<std::string> tracked_;
    std::string script_;
    bool hasUnreadable_ = false;
};

} // namespace vclink::test
