// SPDX-License-Identifier: MIT
#pragma once

#include <memory>

#include "CommitFixture.hpp"
#include "support/libgit2/LibGit2Recorder.hpp"

namespace vclink::test
{

/// Commits by one adapter, whose calls of libgit2 are noted.
class CommitCallsFixture : public CommitFixture
{
  protected:
    CommitCallsFixture()
    {
        adapter_ = makeAdapter(repository_.path());
    }

    void commitOnce()
    {
        adapter_->commit(upath(), u"message");
    }
    void startNoting()
    {
        calls_.reset();
        calls_ = std::make_unique<LibGit2Recorder>();
    }

    std::unique_ptr<vclink::git::GitAdapter> adapter_;
    std::unique_ptr<LibGit2Recorder> calls_;
};

} // namespace vclink::test
