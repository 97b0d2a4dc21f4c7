// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

#include <fcntl.h>
#include <git2.h>
#include <gtest/gtest.h>

#include "main/merge/MergeFixture.hpp"
#include "support/libgit2/LibGit2Recorder.hpp"

namespace vclink::test
{

/// Base of the fixtures whose tests look at the calls to libgit2, and at what becomes of a failure
/// of each.
class BranchCallsFixture : public MergeFixture
{
  protected:
    using Calls = std::vector<std::string>;

    /// Collects the records that the calls are given.
    void collectRecords(LibGit2Recorder &calls)
    {
        calls.on<git_checkout_tree>(
            [this](git_repository *, const git_object *, const git_checkout_options *options)
            { collectCheckout(*options); });
        calls.on<git_checkout_index>(
            [this](git_repository *, git_index *, const git_checkout_options *options)
            { collectCheckout(*options); });
        calls.on<git_merge>(
            [this](git_repository *, const git_annotated_commit **, std::size_t,
                   const git_merge_options *options, const git_checkout_options *checkout)
            {
                merges_.push_back(*options);
                collectCheckout(*checkout);
            });
    }
    void expectCheckoutRecord(const git_checkout_options &record, unsigned strategy) const
    {
        EXPECT_EQ(record.version, 1U);
        EXPECT_EQ(record.checkout_strategy, strategy);
        EXPECT_EQ(record.notify_flags, 0xFFFFU);
        EXPECT_NE(record.notify_cb, nullptr);
        EXPECT_NE(record.progress_cb, nullptr);
        EXPECT_NE(record.perfdata_cb, nullptr);
        const void *const callbacks = &adapter_->getCallbacks().checkoutCallbacks();
        EXPECT_EQ(record.perfdata_payload, callbacks);
        EXPECT_NE(record.baseline, nullptr) << "the tree that was looked at";
        EXPECT_EQ(record.target_directory, nullptr);
        EXPECT_EQ(record.disable_filters, 0);
        EXPECT_EQ(record.file_open_flags, O_CREAT | O_TRUNC | O_WRONLY | O_NOFOLLOW | O_NONBLOCK);
    }

    static Calls joined(const std::vector<Calls> &parts)
    {
        Calls all;
        for (const auto &part : parts)
            all.insert(all.end(), part.begin(), part.end());
        return all;
    }
    /// What looks at the working copy before a checkout, and releases afterwards what it held.
    const Calls openingTheLook_{"git_repository_index", "git_repository_head",
                                "git_reference_peel",   "git_tree_lookup",
                                "git_object_free",      "git_reference_free"};
    const Calls lookBeforeASwitch_ =
        joined({openingTheLook_,
                {"git_object_peel", "git_tree_lookup", "git_tree_entry_bypath", "git_tree_free",
                 "git_object_free"}});
    const Calls lookingUpATree_{"git_commit_lookup", "git_commit_tree", "git_commit_free"};
    const Calls lookBeforeAMerge_ =
        joined({openingTheLook_,
                {"git_reference_name_to_id"},
                lookingUpATree_,
                {"git_merge_bases"},
                lookingUpATree_,
                {"git_index_find_prefix", "git_tree_free", "git_tree_free"}});
    const Calls endOfTheLook_{"git_tree_free", "git_index_free"};

    const Failure injected_{GIT_ERROR, GIT_ERROR_OS, injectedText};
    /// The records of git_checkout_tree, git_checkout_index and git_merge, in order, and their
    /// paths.
    std::vector<git_checkout_options> checkouts_;
    std::vector<Calls> checkoutPaths_;
    std::vector<git_merge_options> merges_;

  private:
    void collectCheckout(const git_checkout_options &options)
    {
        checkouts_.push_back(options);
        checkoutPaths_.emplace_back(options.paths.strings,
                                    options.paths.strings + options.paths.count);
    }
};

} // namespace vclink::test
