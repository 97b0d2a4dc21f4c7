// SPDX-License-Identifier: MIT
#pragma once

#include <optional>
#include <string>

#include "main/checkout/standing.hpp"

namespace vclink::git
{

/// What a checkout is refused for.
struct Obstacle
{
    std::string path;
    /// what is there, and how it gets out of the way if that is not obvious
    std::string text;
};

/// What a rule finds: nothing, if it has no objection.
using Finding = std::optional<Obstacle>;

/// Something that the checkout would write to, delete or stop at.
Obstacle inTheWay(const std::string &name, Standing standing);

/// The same, in a folder that becomes a file.
Obstacle inChangedFolder(const std::string &name, Standing standing);

} // namespace vclink::git
