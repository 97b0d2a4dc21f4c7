// SPDX-License-Identifier: MIT
#include "error/raiser.hpp"

#include "error/raise.hpp"
#include "vclink/git/messageIdentifiers.hpp"

namespace vclink::test
{

void raiseAlreadyAdded(const ustring &files)
{
    git::raise(shared_vclink::git::AlreadyAdded(files));
}

void raiseHasConflictsWhileHandling(int cause)
{
    try
    {
        throw cause;
    }
    catch (int)
    {
        git::raise(shared_vclink::git::HasConflicts());
    }
}

} // namespace vclink::test
