// SPDX-License-Identifier: MIT
#include "main/remote/fetchMoves.hpp"

#include <algorithm>
#include <charconv>
#include <cstddef>
#include <optional>
#include <set>
#include <string_view>
#include <utility>

#include "util/repository/objectIds.hpp"
#include "util/repository/repository.hpp"

namespace vclink::git
{
namespace
{

/// libgit2 takes a source of this form for the id of an object.
std::optional<git_oid> readId(const std::string &source)
{
    git_oid id{};
    const bool isHexadecimal =
        source.find_first_not_of("0123456789abcdefABCDEF") == std::string::npos;
    if (source.size() != idTextSize || !isHexadecimal)
    {
        return std::nullopt;
    }
    const char *digits = source.data();
    for (unsigned char &byte : id.id)
    {
        constexpr int base = 16;
        std::from_chars(digits, digits + 2, byte, base);
        digits += 2;
    }
    return id;
}

/// libgit2 leaves the tags that are here if it follows tags.
bool leavesTags(const FetchSettings &settings, std::string_view source)
{
    return settings.tags == GIT_REMOTE_DOWNLOAD_TAGS_AUTO && isIn(tagsFolder, source);
}

/// Returns true if libgit2 finds out whether a reference moves forward.
bool isGuarded(const FetchSettings &settings, std::string_view source)
{
    return !settings.isShallow && (isIn(branchesFolder, source) || source == "HEAD");
}

/// Remote-tracking branches repeat what the remote had.
bool canHaveWork(const std::string &target)
{
    return !target.empty() && !isIn(trackingFolder, target);
}

bool canMoveWork(const Refspec &refspec)
{
    return !refspec.isForced && canHaveWork(refspec.target.substr(0, refspec.target.find('*')));
}

bool canMoveTag(const Refspec &refspec)
{
    return !refspec.isForced && refspec.canReach(tagsFolder);
}

/// The moves of one fetch.
class TargetMoves
{
  public:
    void add(const Refspec &refspec, const std::string &target, const git_oid &id, bool isGuarded)
    {
        if (refspec.isForced)
        {
            forced_.insert(target);
        }
        else if (isIn(tagsFolder, target) || (canHaveWork(target) && !isGuarded))
        {
            unforced_.push_back({target, id});
        }
    }

    /// As git, lets a '+' count also for the other refspecs with this target.
    std::vector<Move> takeUnforced()
    {
        const auto isForced = [this](const Move &move) { return forced_.count(move.target) != 0; };
        unforced_.erase(std::remove_if(unforced_.begin(), unforced_.end(), isForced),
                        unforced_.end());
        return std::move(unforced_);
    }

  private:
    std::set<std::string> forced_;
    std::vector<Move> unforced_;
};

/// @param name of a reference of the remote
void addMoves(const FetchSettings &settings, const std::string &name, const git_oid &id,
              TargetMoves &moves)
{
    bool isFetched = false;
    for (const Refspec &refspec : settings.active)
    {
        const auto target = refspec.findTarget(name);
        isFetched = isFetched || target;
        if (target && !leavesTags(settings, name))
        {
            moves.add(refspec, *target, id, isGuarded(settings, name));
        }
    }
    for (const Refspec &refspec : settings.passive)
    {
        const auto target = refspec.findTarget(name);
        if (isFetched && target)
        {
            moves.add(refspec, *target, id, false);
        }
    }
    if (settings.tags == GIT_REMOTE_DOWNLOAD_TAGS_ALL && isIn(tagsFolder, name))
    {
        moves.add(Refspec(), name, id, false);
    }
}

} // namespace

FetchSettings readFetchSettings(git_repository *repository, const git_remote *remote,
                                const git_strarray &given, const git_fetch_options &options)
{
    FetchSettings settings;
    settings.active = readEffectiveRefspecs(remote, given, GIT_DIRECTION_FETCH);
    if (given.count != 0)
    {
        settings.passive = readConfiguredRefspecs(remote, GIT_DIRECTION_FETCH);
    }
    settings.tags = options.download_tags != GIT_REMOTE_DOWNLOAD_TAGS_UNSPECIFIED
                        ? options.download_tags
                        : git_remote_autotag(remote);
    settings.isShallow = isShallow(repository);
    return settings;
}

bool mayMoveUnguarded(const FetchSettings &settings)
{
    const auto mayMove = [&settings](const Refspec &refspec)
    {
        return !leavesTags(settings, refspec.source) &&
               (canMoveTag(refspec) ||
                (canMoveWork(refspec) && !isGuarded(settings, refspec.source)));
    };
    return settings.tags == GIT_REMOTE_DOWNLOAD_TAGS_ALL ||
           std::any_of(settings.active.begin(), settings.active.end(), mayMove) ||
           std::any_of(settings.passive.begin(), settings.passive.end(), canMoveWork);
}

std::vector<Move> findUnguardedMoves(const FetchSettings &settings, const AdvertisedIds &ids)
{
    FetchSettings completed = settings;
    completeSources(completed.active, ids);
    completeSources(completed.passive, ids);
    TargetMoves moves;
    for (const auto &[name, id] : ids)
    {
        addMoves(completed, name, id, moves);
    }
    for (const Refspec &refspec : completed.active)
    {
        const auto id = readId(refspec.source);
        if (id)
        {
            moves.add(refspec, refspec.target, *id, false);
        }
    }
    return moves.takeUnforced();
}

} // namespace vclink::git
