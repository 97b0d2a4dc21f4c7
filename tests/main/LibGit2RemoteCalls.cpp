// SPDX-License-Identifier: MIT
// The calls of remotes and clones, beside those of LibGit2Calls.cpp.
#include "LibGit2Calls.hpp"
#include "passToLibGit2.hpp"
#include "support/interposition.hpp"

using vclink::test::findNext;
using vclink::test::LibGit2Calls;
using vclink::test::detail::current;
using vclink::test::detail::injected;
using vclink::test::detail::pass;
using vclink::test::detail::passAcquiring;
using vclink::test::detail::Passing;
using vclink::test::detail::passReleasing;
using vclink::test::detail::tell;

int git_remote_init_callbacks(git_remote_callbacks *callbacks, unsigned version)
{
    return pass("git_remote_init_callbacks", git_remote_init_callbacks, callbacks, version);
}

int git_proxy_options_init(git_proxy_options *options, unsigned version)
{
    return pass("git_proxy_options_init", git_proxy_options_init, options, version);
}

int git_fetch_options_init(git_fetch_options *options, unsigned version)
{
    return pass("git_fetch_options_init", git_fetch_options_init, options, version);
}

int git_push_options_init(git_push_options *options, unsigned version)
{
    return pass("git_push_options_init", git_push_options_init, options, version);
}

int git_clone_options_init(git_clone_options *options, unsigned version)
{
    return pass("git_clone_options_init", git_clone_options_init, options, version);
}

int git_remote_lookup(git_remote **out, git_repository *repository, const char *name)
{
    tell(&LibGit2Calls::onRemoteLookup, name);
    return passAcquiring("git_remote_lookup", git_remote_lookup, out, repository, name);
}

void git_remote_free(git_remote *remote)
{
    passReleasing("git_remote_free", remote);
}

int git_remote_fetch(git_remote *remote, const git_strarray *refspecs,
                     const git_fetch_options *options, const char *reflogMessage)
{
    tell(&LibGit2Calls::onFetch, refspecs, options, reflogMessage);
    return pass("git_remote_fetch", git_remote_fetch, remote, refspecs, options, reflogMessage);
}

int git_remote_push(git_remote *remote, const git_strarray *refspecs,
                    const git_push_options *options)
{
    tell(&LibGit2Calls::onPush, refspecs, options);
    return pass("git_remote_push", git_remote_push, remote, refspecs, options);
}

int git_remote_connect(git_remote *remote, git_direction direction,
                       const git_remote_callbacks *callbacks, const git_proxy_options *proxy,
                       const git_strarray *headers)
{
    tell(&LibGit2Calls::onConnect, direction, callbacks, proxy, headers);
    return pass("git_remote_connect", git_remote_connect, remote, direction, callbacks, proxy,
                headers);
}

int git_remote_disconnect(git_remote *remote)
{
    return pass("git_remote_disconnect", git_remote_disconnect, remote);
}

int git_remote_ls(const git_remote_head ***heads, std::size_t *count, git_remote *remote)
{
    const Passing passing("git_remote_ls");
    if (passing.isNoted() && current->listInstead)
        return current->listInstead(heads, count);
    if (const int code = injected(passing, "git_remote_ls"); code != 0)
        return code;
    return findNext<decltype(git_remote_ls)>("git_remote_ls")(heads, count, remote);
}

int git_clone(git_repository **out, const char *url, const char *path,
              const git_clone_options *options)
{
    tell(&LibGit2Calls::onClone, url, path, options);
    if (current != nullptr && current->cloneInstead)
    {
        const Passing passing("git_clone");
        return current->cloneInstead(out);
    }
    return passAcquiring("git_clone", git_clone, out, url, path, options);
}
