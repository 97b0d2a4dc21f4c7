// SPDX-License-Identifier: MIT
#pragma once

#include "main/checkout/Obstacle.hpp"
#include "main/checkout/WorkingCopy.hpp"

namespace vclink::git
{

/// Returns the finding of the first rule that objects.
template <class Rules, class Subject>
Finding ask(const Rules &rules, WorkingCopy &copy, const Subject &subject)
{
    for (const auto rule : rules)
    {
        Finding finding = rule(copy, subject);
        if (finding)
        {
            return finding;
        }
    }
    return {};
}

} // namespace vclink::git
