// SPDX-License-Identifier: MIT
#pragma once

#include <array>
#include <string_view>

namespace vclink::git
{

/// The operations that stand in the interfaces and that this build does not carry out yet.
inline constexpr std::array slotsNotAvailable{
    std::string_view("GitAdapterFactory::createWorkingCopyGenerator"),
    std::string_view("toGitRemoteCallbacks"),
    std::string_view("toGitFetchOptions"),
    std::string_view("toGitPushOptions"),
    std::string_view("toGitCloneOptions"),
};

/// What each of them does.
/// @throws LibGit2Exception with the text "not available in this build" and code GIT_ERROR
[[noreturn]] void raiseNotAvailable();

} // namespace vclink::git
