// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <string>
#include <vector>

#include "exitStatus.hpp"
#include "namedPaths.hpp"

/// What a person has to be told of names for which the back end does nothing without a word, or
/// more than was asked for.
namespace vclink::shell
{

/// Why a command can't do what was asked for with what was named; an empty text where it can.
using Objection = std::function<std::string(const NamedPath &)>;

/// @param refusal what has not been done, as the beginning of a sentence
/// @throws ShellFailure that names each path that there is an objection to
void refuseUnless(const std::string &refusal, const std::vector<NamedPath> &paths,
                  const Objection &objection);

/// Why no file is found under a name: it lies elsewhere, is ignored, does not exist.
std::string explainAbsence(const upath &root, const NamedPath &named);

/// Why a name that would be followed to another file can't be served; an empty text where it would
/// not be.
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

/// Why nothing that was named is tracked; an empty text where something is.
std::string explainUntracked(const upath &root, const NamedPath &named);

/// Those of these files that now still have a state that `matters` holds for, in spite of what was
/// done.
/// @throws ShellFailure if their states can't be known
FileStateMap findLeftOut(CMAdapter &adapter, const FileStateMap &files,
                         const std::function<bool(FileState::State)> &matters);

/// Tells of files that were left out, and why.
/// @param refusal what has not been done to them, as the beginning of a sentence
/// @return Failed when there are any
ExitStatus tellLeftOut(const std::string &refusal, const upath &root, const FileStateMap &leftOut);

} // namespace vclink::shell
