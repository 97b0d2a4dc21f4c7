// SPDX-License-Identifier: MIT
#pragma once

#include <memory>
#include <optional>
#include <string>
#include <typeinfo>
#include <vector>

#include <gtest/gtest.h>

#include "support/Failure.hpp"
#include "support/GitFixture.hpp"
#include "support/LibGit2Session.hpp"
#include "support/TestInteractor.hpp"
#include "support/text.hpp"
#include "vclink/CMAdapter.hpp"
#include "vclink/WorkingCopyGenerator.hpp"
#include "vclink/git/GitRemote.hpp"
#include "vclink/util/exception/CancelledOperationException.hpp"

namespace vclink::test
{

/// Whether an operation ends with a cancellation, and with nothing derived from it.
template <class Operation> testing::AssertionResult isCancelled(Operation operation)
{
    try
    {
        operation();
    }
    catch (const std::exception &exception)
    {
        if (typeid(exception) == typeid(util::exception::CancelledOperationException))
            return testing::AssertionSuccess();
        return testing::AssertionFailure() << typeid(exception).name() << ": " << exception.what();
    }
    return testing::AssertionFailure() << "nothing was raised";
}

/// A repository's references, a line each: the name, the id, and the target of a symbolic one.
std::string referencesOf(const GitRepository &repository);

/// Base of the fixtures whose tests clone, fetch and push as a host does.
class RemoteFixture : public GitFixture
{
  protected:
    std::unique_ptr<WorkingCopyGenerator> makeGenerator() const;
    std::unique_ptr<CMAdapter> makeAdapter(const GitRepository &repository) const;

    /// A clone made by a generator of its own, in the test's folder.
    GitRepository clone(const std::string &url, const std::string &name) const;
    /// The remote "origin", with its own adapter.
    void fetch(const GitRepository &repository,
               const std::vector<std::string> &refspecs = {}) const;
    void push(const GitRepository &repository, const std::vector<std::string> &refspecs) const;
    std::vector<git::GitRemoteHead> heads(const GitRepository &repository) const;

    /// Expects that git finds nothing wrong with the repository, and nothing left under way.
    static void expectSound(const GitRepository &repository);

    std::shared_ptr<TestInteractor> interactor_ = std::make_shared<TestInteractor>();
    LibGit2Session session_{environment()};
};

} // namespace vclink::test
