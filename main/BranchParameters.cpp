// SPDX-License-Identifier: MIT
#include "vclink/git/BranchParameters.hpp"

namespace vclink::git
{

BranchParameters::BranchParameters(const std::string &name, const std::string &startPoint)
    : name_(name), startPoint_(startPoint)
{
}

std::string BranchParameters::getName() const
{
    return name_;
}

std::string BranchParameters::getStartPoint() const
{
    return startPoint_;
}

} // namespace vclink::git
