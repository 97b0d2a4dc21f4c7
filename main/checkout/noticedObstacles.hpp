// SPDX-License-Identifier: MIT
#pragma once

#include <git2/checkout.h>

#include "main/checkout/Obstacle.hpp"
#include "main/checkout/WorkingCopy.hpp"

/// The rules that judge what libgit2 tells before it writes the first file. For a merge this is
/// after its commands have run, so that they see what was saved meanwhile.
namespace vclink::git
{

/// The arguments of git_checkout_notify_cb. A folder's name in `workdir` ends with a slash.
struct CheckoutNotice
{
    git_checkout_notify_t why;
    const char *path;
    const git_diff_file *baseline;
    const git_diff_file *target;
    const git_diff_file *workdir;
};

// Of every checkout.

/// What libgit2 did not see where it is going to write: a FIFO, a socket or a device, a link or a
/// file above that its walk is past, a folder in the place of a file.
Finding findUnseen(WorkingCopy &copy, const CheckoutNotice &notice);

// Of a switch or a fast-forward.

/// A missing file that becomes a folder: libgit2 would fail in the midst of its writing.
Finding findMissingFile(WorkingCopy &copy, const CheckoutNotice &notice);

// Of a merge, which would undo, overwrite or delete these.

/// A change of a tracked file. Changes in a submodule stay, and are none.
Finding findEdit(WorkingCopy &copy, const CheckoutNotice &notice);
/// Something untracked where a file comes, unless it is ignored.
Finding findUntrackedNoticed(WorkingCopy &copy, const CheckoutNotice &notice);
/// Something that HEAD does not have in a folder that becomes a file.
Finding findForeignInFolderNoticed(WorkingCopy &copy, const CheckoutNotice &notice);
/// A folder with files in the place of a tracked file.
Finding findFolderNoticed(WorkingCopy &copy, const CheckoutNotice &notice);
/// A submodule with files that becomes a file.
Finding findSubmoduleNoticed(WorkingCopy &copy, const CheckoutNotice &notice);
/// A change that Git hides; see findHiddenEdit.
Finding findHiddenEditNoticed(WorkingCopy &copy, const CheckoutNotice &notice);

} // namespace vclink::git
