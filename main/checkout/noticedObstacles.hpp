// SPDX-License-Identifier: MIT
#pragma once

#include <git2/checkout.h>

#include "main/checkout/Obstacle.hpp"
#include "main/checkout/WorkingCopy.hpp"

/// The rules for the files that libgit2 reports before it writes the first one. In a merge they run
/// after its commands, so that they see what was saved in between.
namespace vclink::git
{

/// The arguments of git_checkout_notify_cb. The name of a folder in `workdir` ends with a slash.
struct CheckoutNotice
{
    git_checkout_notify_t why;
    const char *path;
    const git_diff_file *baseline;
    const git_diff_file *target;
    const git_diff_file *workdir;
};

// For every checkout.

/// Finds what libgit2 did not see in a place where it will write: a FIFO, a socket or a device, a
/// link or a file above that its walk has already passed, a folder in the place of a file.
Finding findUnseen(WorkingCopy &copy, const CheckoutNotice &notice);

// For a switch or a fast-forward.

/// Finds a missing file that becomes a folder: libgit2 would fail in the middle of its writing.
Finding findMissingFile(WorkingCopy &copy, const CheckoutNotice &notice);

// For a merge, which would undo, overwrite or delete these.

/// Finds a change of a tracked file. Changes in a submodule stay and do not count.
Finding findEdit(WorkingCopy &copy, const CheckoutNotice &notice);
/// Finds something untracked in the place of a new file, unless it is ignored.
Finding findUntrackedNoticed(WorkingCopy &copy, const CheckoutNotice &notice);
/// Finds something that HEAD does not have in a folder that becomes a file.
Finding findForeignInFolderNoticed(WorkingCopy &copy, const CheckoutNotice &notice);
/// Finds a folder with files in the place of a tracked file.
Finding findFolderNoticed(WorkingCopy &copy, const CheckoutNotice &notice);
/// Finds a submodule with files that becomes a file.
Finding findSubmoduleNoticed(WorkingCopy &copy, const CheckoutNotice &notice);
/// Finds a change that Git hides; see findHiddenEdit.
Finding findHiddenEditNoticed(WorkingCopy &copy, const CheckoutNotice &notice);

} // namespace vclink::git
