// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <string>
#include <vector>

#include "exitStatus.hpp"
#include "namedPaths.hpp"

/// What the user has to know about names for which the back end silently does nothing, or more than
/// requested.
namespace vclink::shell
{

/// Why a command can't work with what was named; an empty text if it can.
using Objection = std::function<std::string(const NamedPath &)>;

/// @param refusal what has not been done, as the beginning of a sentence
/// @throws ShellFailure that names each path with an objection
void refuseUnless(const std::string &refusal, const std::vector<NamedPath> &paths,
                  const Objection &objection);

/// Why no file is found under a name: it lies elsewhere, is ignored, does not exist.
std::string explainAbsence(const upath &root, const NamedPath &named);

/// Why a command can't work with a name that the back end would follow to another file; an empty
/// text if it would not follow it.
/// @param instead what to do in place of the command
std::string explainLink(const NamedPath &named, const std::string &instead);

/// @param list what the back end is to act on, for what was named
/// @param matters whether a file of this state would be changed
/// @throws ShellFailure when the back end would also change files that were not named
void refuseStrays(const std::string &refusal, CMAdapter &adapter,
                  const std::vector<NamedPath> &paths, const std::vector<upath> &list,
                  const std::function<bool(FileState::State)> &matters);

/// Whether a file with a state is the folder of a repository that is not tracked.
bool isRepository(const upath &entry);

/// Why nothing that was named is tracked; an empty text if something is.
std::string explainUntracked(const upath &root, const NamedPath &named);

/// The files that still have a state for which `matters` holds, although the operation is done.
/// @throws ShellFailure if their states can't be known
FileStateMap findLeftOut(CMAdapter &adapter, const FileStateMap &files,
                         const std::function<bool(FileState::State)> &matters);

/// Names the files that were left out, and why.
/// @param refusal what has not been done to them, as the beginning of a sentence
/// @return Failed when there are any
ExitStatus tellLeftOut(const std::string &refusal, const upath &root, const FileStateMap &leftOut);

} // namespace vclink::shell
