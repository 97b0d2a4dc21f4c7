// SPDX-License-Identifier: MIT
#include "run.hpp"

#include <stdexcept>
#include <utility>

namespace vclink::test
{

std::string runOrThrow(const Command &command)
{
    auto result = command.run();
    if (!result.succeeded())
        throw std::runtime_error(command.text() + ": exit status " +
                                 std::to_string(result.exitStatus) + "\n" + result.errors);
    return std::move(result.output);
}

} // namespace vclink::test
