// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <optional>
#include <string>
#include <vector>

#include "RecordReader.hpp"

namespace vclink::shell
{

/// What a server made of a reference that was pushed.
struct PushedReference
{
    std::string name;
    /// the server's reason for rejecting it; empty when it was taken
    std::string rejection;
};

/// What became known of an operation with a remote.
struct RemoteNotes
{
    /// the kinds of credentials that the server asked for last, as libgit2's bits; nothing when it
    /// asked for none
    std::optional<unsigned> credentials;
    /// whether the address for which it asked has a password
    bool hasPassword = false;
    /// how many references of the working copy changed
    unsigned updated = 0;
    std::vector<PushedReference> pushed;
    /// what the server said in words, line by line, without reports of progress
    std::vector<std::string> words;
    /// called with each line that the server says, and whether it reports progress; may be empty
    std::function<void(const std::string &line, bool isProgress)> hear;
    /// the beginning of a line whose end has not come yet
    std::string unfinished;
};

/// Takes what a record of the library's log contains of these notes.
void takeNote(RemoteNotes &notes, const std::string &record);

/// While it lives, reads notes from the library's log: an operation with a remote only logs which
/// credentials were requested and which references were rejected. At most one object at a time.
class RemoteLog
{
  public:
    /// @param notes outlives the object
    explicit RemoteLog(RemoteNotes &notes);
    RemoteLog(const RemoteLog &) = delete;
    RemoteLog &operator=(const RemoteLog &) = delete;
    /// Also notes a last line without an end.
    ~RemoteLog();

  private:
    RemoteNotes &notes_;
    RecordReader reader_;
};

} // namespace vclink::shell
