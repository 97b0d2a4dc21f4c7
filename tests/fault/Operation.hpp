// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <memory>
#include <ostream>
#include <string>
#include <vector>

#include "main/files/GitAdapter.hpp"
#include "support/GitRepository.hpp"
#include "support/TestInteractor.hpp"

namespace vclink::test
{

/// What an operation runs on.
struct Subject
{
    GitRepository repository;
    std::shared_ptr<TestInteractor> interactor;
    std::shared_ptr<git::GitAdapter> adapter;

    upath pathOf(const std::string &name) const;
    std::vector<upath> pathsOf(const std::vector<std::string> &names) const;
};

/// One call of the host, and what it answers, as text.
using Action = std::function<std::string()>;

/// An operation of an exported class on a working copy that gives it something to do.
struct Operation
{
    std::string name;
    /// Makes the working copy of a new repository.
    std::function<void(GitRepository &)> prepare;
    /// Makes what the operation is called on; the action calls it.
    std::function<Action(const Subject &)> make;
    /// How it ends where an earlier call, which failed, has done its work all the same; empty where
    /// that makes no difference.
    std::string refusal{};
    /// What clears that away: commands of git.
    std::vector<std::vector<std::string>> clearing{};
    /// Whether it changes the working copy, the repository or the configuration.
    bool writes = true;
};

std::ostream &operator<<(std::ostream &stream, const Operation &operation);

/// The operations of every exported class. Each has a name of its own.
const std::vector<Operation> &allOperations();
std::vector<Operation> adapterOperations();
std::vector<Operation> branchOperations();
std::vector<Operation> remoteOperations();
std::vector<Operation> otherOperations();

/// Runs an action.
/// @return "done" and its result, or the exception that it throws: type, code, class and text
std::string outcomeOf(const Action &action);
/// The outcome that is a LibGit2Exception.
std::string failure(int code, int errorClass, const std::string &text);
/// The outcome that is a GitException of a merge of "topic", with this added text.
std::string mergeFailure(const std::string &addedText);

} // namespace vclink::test
