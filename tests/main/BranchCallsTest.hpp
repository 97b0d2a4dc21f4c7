// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

#include <fcntl.h>
#include <git2.h>
#include <gtest/gtest.h>

#include "BranchCalls.hpp"
#include "MergeTest.hpp"

namespace vclink::test
{

/// Base of the fixtures whose tests look at the calls to libgit2, and at what becomes of a failure
/// of each.
class BranchCallsTest : public MergeTest
{
  protected:
    using Calls = std::vector<std::string>;

    void expectCheckoutRecord(const git_checkout_options &record, unsigned strategy) const
    {
        EXPECT_EQ(record.version, 1U);
        EXPECT_EQ(record.checkout_strategy, strategy);
        EXPECT_EQ(record.notify_flags, 0xFFFFU);
        EXPECT_NE(record.notify_cb, nullptr);
        EXPECT_NE(record.progress_cb, nullptr);
        EXPECT_NE(record.perfdata_cb, nullptr);
        const void *const callbacks = &adapter_->getCallbacks().checkoutCallbacks();
        EXPECT_EQ(record.progress_payload, callbacks);
        EXPECT_EQ(record.perfdata_payload, callbacks);
        EXPECT_EQ(record.baseline, nullptr);
        EXPECT_EQ(record.target_directory, nullptr);
        EXPECT_EQ(record.disable_filters, 0);
        EXPECT_EQ(record.file_open_flags, O_CREAT | O_TRUNC | O_WRONLY | O_NOFOLLOW);
    }

    const LibGit2Failure injected_{GIT_ERROR, GIT_ERROR_OS, "injected"};
};

} // namespace vclink::test
