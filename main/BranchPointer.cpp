// SPDX-License-Identifier: MIT
#include "vclink/git/BranchPointer.hpp"

#include <utility>

namespace vclink::git
{

BranchPointer::BranchPointer(const std::string &name) : name_(name)
{
}

BranchPointer::BranchPointer(std::string &&name) noexcept : name_(std::move(name))
{
}

std::string BranchPointer::getName() const
{
    return name_;
}

bool operator==(const BranchPointer &left, const BranchPointer &right)
{
    return left.getName() == right.getName();
}

bool operator!=(const BranchPointer &left, const BranchPointer &right)
{
    return !(left == right);
}

} // namespace vclink::git
