// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <functional>
#include <map>
#include <memory>
#include <string>

#include "main/files/GitAdapter.hpp"
#include "support/Change.hpp"
#include "support/GitFixture.hpp"
#include "support/LibGit2Session.hpp"
#include "support/TestInteractor.hpp"
#include "vclink/FileState.hpp"
#include "vclink/FileStateMap.hpp"

namespace vclink::test
{

/// States by name relative to a root, both as text, so that a failure is readable.
using States = std::map<std::string, std::string>;

inline const std::string notAnIndex =
    "this is no index, and long enough to be told from an empty one";

/// The name of a state, "Modified" and so on.
std::string nameOf(FileState state);

/// A key that does not begin with the root's text stays whole.
States statesBelow(const std::string &root, const FileStateMap &states);

/// Expects that `action` ends with the exception of a cancellation and leaves nothing: no
/// descriptor and no exception of a callback.
void expectCancelled(const std::function<void()> &action);

/// Base of the fixtures whose tests run an adapter.
class AdapterFixture : public GitFixture
{
  protected:
    std::unique_ptr<git::GitAdapter> makeAdapter(const std::string &root) const;

    /// The states that a new adapter gives for the whole tree.
    States allStates(const GitRepository &repository) const;
    /// The states that a new adapter gives for a list of names.
    States states(const GitRepository &repository, const std::vector<std::string> &names) const;
    /// The states that a new adapter gives for a folder.
    States folderStates(const GitRepository &repository, const std::string &name) const;

    std::shared_ptr<TestInteractor> interactor_ = std::make_shared<TestInteractor>();
    LibGit2Session session_{environment()};
};

} // namespace vclink::test
