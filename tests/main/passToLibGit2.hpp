// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "LibGit2Calls.hpp"
#include "error/errorUtil/setGitError.hpp"
#include "support/interposition.hpp"

/// What the definitions that stand in libgit2's place are made of.
namespace vclink::test::detail
{

inline LibGit2Calls *current = nullptr;
inline int depth = 0;

/// A call that passes through, noted unless libgit2 makes it of itself.
class Passing
{
  public:
    explicit Passing(const char *name) : isNoted_(current != nullptr && depth == 0)
    {
        if (isNoted_)
        {
            current->names.emplace_back(name);
            if (current->onCall)
                current->onCall(name);
        }
        ++depth;
    }
    Passing(const Passing &) = delete;
    Passing &operator=(const Passing &) = delete;
    ~Passing()
    {
        --depth;
    }

    bool isNoted() const noexcept
    {
        return isNoted_;
    }

  private:
    bool isNoted_;
};

/// @return the code to answer instead of calling libgit2, or 0
inline int injected(const Passing &passing, const char *name)
{
    if (!passing.isNoted())
        return 0;
    const auto found = current->failing.find(name);
    if (found == current->failing.end())
        return 0;
    git_error_set_str(GIT_ERROR_OS, "injected");
    return found->second;
}

template <class Function, class... Arguments>
int pass(const char *name, Function *, Arguments... arguments)
{
    const Passing passing(name);
    if (const int code = injected(passing, name); code != 0)
        return code;
    return findNext<Function>(name)(arguments...);
}

/// As pass(), of a call that gives out a handle.
template <class Handle, class Function, class... Arguments>
int passAcquiring(const char *name, Function *, Handle **out, Arguments... arguments)
{
    const Passing passing(name);
    if (const int code = injected(passing, name); code != 0)
        return code;
    const int code = findNext<Function>(name)(out, arguments...);
    if (passing.isNoted() && code == 0 && out != nullptr)
        current->handles.insert(*out);
    return code;
}

/// Of a call that takes a handle back.
template <class Handle> void passReleasing(const char *name, Handle *handle)
{
    const Passing passing(name);
    if (passing.isNoted())
        current->handles.erase(handle);
    findNext<void(Handle *)>(name)(handle);
}

template <class Hook, class... Arguments> void tell(Hook hook, Arguments... arguments)
{
    if (current != nullptr && depth == 0 && current->*hook)
        (current->*hook)(arguments...);
}

} // namespace vclink::test::detail
