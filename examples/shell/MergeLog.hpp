// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>
#include <map>
#include <string>

#include "RecordReader.hpp"

namespace vclink::shell
{

/// What became known of a merge.
struct MergeNotes
{
    /// libgit2's code of the last failure; 0 if there was none
    int failure = 0;
    /// the text of the exception that ended the merge; empty if none did
    std::string text;
    /// the driver whose command ran last, and the command
    std::string driver;
    std::string command;
    /// how many files the command of each driver has refused
    std::map<std::string, std::size_t> refusals;
};

/// Takes what a record of the library's log contains of these notes.
void takeNote(MergeNotes &notes, const std::string &record);

/// While it lives, reads notes from the library's log: only there are the commands that have
/// refused a file, and libgit2's code of a failed merge. At most one object at
/// a time.
class MergeLog
{
  public:
    /// @param notes outlives the object
    explicit MergeLog(MergeNotes &notes);

  private:
    RecordReader reader_;
};

} // namespace vclink::shell
