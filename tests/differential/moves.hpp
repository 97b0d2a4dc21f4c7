// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

#include "GitReport.hpp"

namespace vclink::test
{

/// How a file of the index differs from HEAD.
struct IndexChange
{
    /// where it is in the index, or was in HEAD if it is no longer
    std::string place;
    /// the path that it is reported under: the one in HEAD, if HEAD has it
    std::string path;
    /// '.', M, T, A, D, and R for moved
    char letter = '.';
    std::string headMode;
    std::string headId;
    std::string indexMode;
    std::string indexId;
    /// moved, with other bytes
    bool edited = false;
};

/// Joins what is gone with what is new where both are alike; git is asked not to, since it pairs
/// other files where several are alike. Changes come and leave in the order of their places.
void joinMoves(std::vector<IndexChange> &changes, const Blobs &blobs);

/// The ids of the contents that joinMoves() may have to compare.
std::vector<std::string> moveCandidates(const GitReport &report);

} // namespace vclink::test
