// SPDX-License-Identifier: MIT
#pragma once

#include <map>
#include <optional>
#include <string>
#include <vector>

#include <git2/net.h>
#include <git2/oid.h>
#include <git2/remote.h>

#include "main/remote/Refspec.hpp"

/// What the obstacles of a fetch and of a push look at before libgit2 writes.
namespace vclink::git
{

/// The ids of a remote's references, by their names.
using AdvertisedIds = std::map<std::string, git_oid>;

/// Connects the remote, unless it is connected, and returns what it advertises. The fetch or push
/// that follows on the same handle uses this connection. git_remote_connect, git_remote_ls.
AdvertisedIds lookAtRemote(git_remote *remote, git_direction direction,
                           const git_remote_callbacks &callbacks, const git_proxy_options &proxy);

/// Completes short names of a fetch as libgit2 does: a branch comes before a tag.
void completeSources(std::vector<Refspec> &refspecs, const AdvertisedIds &ids);

/// Returns the id of a reference; nothing if there is none. git_reference_name_to_id.
std::optional<git_oid> findId(git_repository *repository, const std::string &reference);

/// Returns true if the commit is, or descends from, the other one. Unlike
/// git_graph_descendant_of, goes on if parents are missing, as in a shallow repository. Returns
/// false for an object that is no commit. git_commit_lookup.
bool descendsFrom(git_repository *repository, const git_oid &commit, const git_oid &ancestor);

} // namespace vclink::git
