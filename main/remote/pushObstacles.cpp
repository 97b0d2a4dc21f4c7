// SPDX-License-Identifier: MIT
#include "main/remote/pushObstacles.hpp"

#include <algorithm>
#include <iterator>
#include <string>
#include <vector>

#include <git2/errors.h>

#include "error/errorUtil/raiseGitError.hpp"
#include "main/remote/Refspec.hpp"
#include "main/remote/lookAhead.hpp"
#include "main/remote/rejectedPush.hpp"
#include "util/repository/objectIds.hpp"
#include "util/repository/repository.hpp"

namespace vclink::git
{
namespace
{

bool writesTag(const Refspec &refspec)
{
    return !refspec.isForced && !refspec.source.empty() && isIn(tagsFolder, refspec.target);
}

} // namespace

void refusePushThatLoses(git_repository *repository, git_remote *remote,
                         const PathspecArray &refspecs, const git_push_options &options)
{
    const std::vector<Refspec> effective =
        readEffectiveRefspecs(remote, refspecs.array(), GIT_DIRECTION_PUSH);
    refuseRejectedPush(repository, remote, effective);
    std::vector<Refspec> tags;
    std::copy_if(effective.begin(), effective.end(), std::back_inserter(tags), writesTag);
    if (tags.empty())
    {
        return;
    }
    const AdvertisedIds ids =
        lookAtRemote(remote, GIT_DIRECTION_PUSH, options.callbacks, options.proxy_opts);
    for (const Refspec &tag : tags)
    {
        const auto there = ids.find(tag.target);
        if (there != ids.end() && !isSameId(there->second, *revparseId(tag.source, repository)))
        {
            raiseGitError(GIT_ENONFASTFORWARD, GIT_ERROR_REFERENCE,
                          "'" + tag.target +
                              "' is another tag at the remote: begin the refspec with '+' to "
                              "replace it there");
        }
    }
}

} // namespace vclink::git
