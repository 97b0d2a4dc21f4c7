// SPDX-License-Identifier: MIT
#pragma once

#include <algorithm>
#include <string>
#include <vector>

#include "support/libgit2/LibGit2Recorder.hpp"
#include "support/libgit2Release.hpp"

namespace vclink::test
{

/// The handles that an operation has left open, without the configuration that a lock closes when
/// it is given up.
inline std::vector<std::string> openHandles(const LibGit2Recorder &recorder)
{
    std::vector<std::string> open = recorder.openHandles();
    const std::vector<std::string> &steps = recorder.steps();
    const auto lock = std::find(steps.begin(), steps.end(), "git_config_lock");
    const auto last =
        std::find_if(lock, steps.end(),
                     [](const std::string &step) {
                         return step == "git_transaction_commit" || step == "git_transaction_free";
                     });
    const bool isGivenUp = last != steps.end() && *last == "git_transaction_free";
    const auto file = std::find(open.begin(), open.end(), "git_config_open_ondisk");
    if (libgit2_release::closesLockedFile && isGivenUp && file != open.end())
    {
        open.erase(file);
    }
    return open;
}

} // namespace vclink::test
