// SPDX-License-Identifier: MIT
#pragma once

#include <utility>

namespace vclink::desktop
{

/// A new object that Qt deletes with its parent, which is the last argument of its constructor.
template <class Object, class Parent, class... Arguments>
Object *makeOwned(Parent *parent, Arguments &&...arguments)
{
    return new Object(std::forward<Arguments>(arguments)..., parent);
}

} // namespace vclink::desktop
