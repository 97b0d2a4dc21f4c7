// SPDX-License-Identifier: MIT
#pragma once

#include <optional>
#include <string>
#include <vector>

#include "PushRefspec.hpp"

namespace vclink::shell
{

/// Completes one side of a refspec if the other side is a name: replaces its "*" by the part of the
/// name that the other "*" matches. Returns nothing if the name does not match.
/// @param from, to the sides; both have a "*" or none has
std::optional<std::string> mapReference(const std::string &from, const std::string &to,
                                        const std::string &name);

/// The refspecs of the setting remote.NAME.push, each for one reference, as the back end knows no
/// patterns in a push: ":" means the branches that both sides have.
/// @param references that are here
/// @param askHeads asks the remote for its references
std::vector<std::string> expandPush(const std::vector<std::string> &configured,
                                    const std::vector<std::string> &references,
                                    const AskHeads &askHeads);

} // namespace vclink::shell
