// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

#include <sys/types.h>

namespace vclink::git
{

/// Removes what a checkout would write through or block at. At its end, restores everything whose
/// place is still free: that is all of it after a checkout that failed or was cancelled.
class ClearedWay
{
  public:
    ClearedWay() = default;
    ClearedWay(const ClearedWay &) = delete;
    ClearedWay &operator=(const ClearedWay &) = delete;
    ~ClearedWay();

    /// Removes a link, a FIFO, a socket, a device or an empty folder; leaves anything else. Sockets
    /// and devices cannot be put back.
    /// @param path absolute
    /// @throws LibGit2Exception if it cannot be removed
    void remove(const std::string &path);

    /// Notes an empty folder that libgit2 may still be about to read.
    /// @param path absolute
    void removeLater(const std::string &path);
    /// Removes the noted folders. Call it right before the checkout writes.
    void removeNoted() noexcept;

  private:
    struct Removed
    {
        std::string path;
        mode_t mode;
        std::string target;
    };
    static void putBack(const Removed &removed);

    std::vector<Removed> removed_;
    std::vector<Removed> noted_;
};

} // namespace vclink::git
