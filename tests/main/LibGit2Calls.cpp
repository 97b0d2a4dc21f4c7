// SPDX-License-Identifier: MIT
#include "LibGit2Calls.hpp"

#include <stdexcept>

#include <dlfcn.h>

namespace
{

vclink::test::LibGit2Calls *current = nullptr;

template <class Function> Function *findReal(const char *name)
{
    void *const symbol = ::dlsym(RTLD_NEXT, name);
    if (symbol == nullptr)
        throw std::runtime_error(name);
    return reinterpret_cast<Function *>(symbol);
}

void note(const char *name)
{
    if (current != nullptr)
        current->names.emplace_back(name);
}

} // namespace

namespace vclink::test
{

LibGit2Calls::LibGit2Calls()
{
    current = this;
}

LibGit2Calls::~LibGit2Calls()
{
    current = nullptr;
}

} // namespace vclink::test

int git_libgit2_init()
{
    note("git_libgit2_init");
    if (current != nullptr && current->onInit)
        return current->onInit();
    return findReal<decltype(git_libgit2_init)>("git_libgit2_init")();
}

int git_libgit2_shutdown()
{
    note("git_libgit2_shutdown");
    if (current != nullptr && current->onShutdown)
        return current->onShutdown();
    return findReal<decltype(git_libgit2_shutdown)>("git_libgit2_shutdown")();
}

int git_libgit2_version(int *major, int *minor, int *revision)
{
    note("git_libgit2_version");
    if (current != nullptr && current->onVersion)
        return current->onVersion(major, minor, revision);
    return findReal<decltype(git_libgit2_version)>("git_libgit2_version")(major, minor, revision);
}

int git_libgit2_features()
{
    note("git_libgit2_features");
    if (current != nullptr && current->onFeatures)
        return current->onFeatures();
    return findReal<decltype(git_libgit2_features)>("git_libgit2_features")();
}

int git_status_options_init(git_status_options *options, unsigned version)
{
    note("git_status_options_init");
    if (current != nullptr && current->onStatusOptionsInit)
        return current->onStatusOptionsInit();
    return findReal<decltype(git_status_options_init)>("git_status_options_init")(options, version);
}

int git_repository_open_ext(git_repository **out, const char *path, unsigned flags,
                            const char *ceilings)
{
    note(out == nullptr ? "git_repository_open_ext(nullptr)" : "git_repository_open_ext");
    if (current != nullptr && current->onOpen)
        current->onOpen(path, flags, ceilings);
    return findReal<decltype(git_repository_open_ext)>("git_repository_open_ext")(out, path, flags,
                                                                                  ceilings);
}

int git_status_foreach_ext(git_repository *repository, const git_status_options *options,
                           git_status_cb callback, void *payload)
{
    note("git_status_foreach_ext");
    auto *const real = findReal<decltype(git_status_foreach_ext)>("git_status_foreach_ext");
    if (current != nullptr && current->onStatusForeach)
        return current->onStatusForeach(real, repository, options, callback, payload);
    return real(repository, options, callback, payload);
}

void git_repository_free(git_repository *repository)
{
    note("git_repository_free");
    findReal<decltype(git_repository_free)>("git_repository_free")(repository);
}
