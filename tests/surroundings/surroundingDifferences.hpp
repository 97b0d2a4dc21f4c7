// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

namespace vclink::test
{

/// What git and the library do in the same situation.
struct Comparand
{
    std::string operation;
    std::string obstacle;
    std::string place;
    /// "goes through", "stops in conflicts" or "refuses"
    std::string git;
    /// the same, or "leaves something else" where git does neither refuse
    std::string library;
    bool hasSiblings = false;
};

/// Situations in which the library is not as git is, and why.
struct SurroundingDifference
{
    std::vector<std::string> operations;
    /// none for any
    std::vector<std::string> obstacles;
    /// the whole name, or how it begins, with a '*'
    std::string place;
    std::string git;
    std::string library;
    std::string reason;
    /// whether this is so only beside siblings; see siblingOf()
    bool isOfSiblings = false;

    bool explains(const Comparand &comparand) const;
    /// Whether it is of this operation and place.
    bool isAbout(const Comparand &comparand) const;
};

const std::vector<SurroundingDifference> &surroundingDifferences();

} // namespace vclink::test
