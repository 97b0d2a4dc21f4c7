// SPDX-License-Identifier: MIT
#pragma once

#include "fl/ustring.hpp"

namespace vclink::test
{

/// Raise as the library does, but from a shared library of the tests' own, so that the exceptions
/// cross a boundary whichever operations the library has.
__attribute__((visibility("default"))) void raiseAlreadyAdded(const ustring &files);
__attribute__((visibility("default"))) void raiseHasConflictsWhileHandling(int cause);

} // namespace vclink::test
