// SPDX-License-Identifier: MIT
#include <memory>
#include <string>
#include <vector>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "AdapterTest.hpp"
#include "support/libgit2/LibGit2Recorder.hpp"
#include "support/libgit2Release.hpp"
#include "support/text.hpp"

namespace
{

using testing::ElementsAre;
using vclink::test::asPath;
using vclink::test::LibGit2Recorder;

/// What a walk was asked for.
struct Asked
{
    git_status_options options{};
    std::vector<std::string> pathspec;
    std::string repository;
    bool hasCallback = false;
    bool hasPayload = false;
};

/// The record that the library hands to a status walk.
class StatusRecord : public vclink::test::AdapterTest
{
  protected:
    StatusRecord()
    {
        calls_.answer<git_status_foreach_ext>(
            [this](auto, git_repository *repository, const git_status_options *options,
                   git_status_cb callback, void *payload)
            {
                const git_strarray &pathspec = options->pathspec;
                walks_.push_back({*options,
                                  {pathspec.strings, pathspec.strings + pathspec.count},
                                  git_repository_workdir(repository),
                                  callback != nullptr,
                                  payload != nullptr});
                return 0;
            });
        adapter_ = makeAdapter(repository_.path());
    }

    vclink::test::GitRepository repository_ = makeRepository();
    LibGit2Recorder calls_;
    std::vector<Asked> walks_;
    std::unique_ptr<vclink::git::GitAdapter> adapter_;
};

TEST_F(StatusRecord, HasTheValuesOfEveryField)
{
    adapter_->getFolderStates(adapter_->getRootFolder());
    ASSERT_EQ(walks_.size(), 1U);
    const git_status_options &options = walks_[0].options;
    EXPECT_EQ(options.version, 1U);
    EXPECT_EQ(options.show, GIT_STATUS_SHOW_INDEX_AND_WORKDIR);
    EXPECT_EQ(options.show, 0);
    EXPECT_EQ(options.flags, 0x95U);
    EXPECT_EQ(options.flags, static_cast<unsigned>(GIT_STATUS_OPT_INCLUDE_UNTRACKED |
                                                   GIT_STATUS_OPT_INCLUDE_UNMODIFIED |
                                                   GIT_STATUS_OPT_RECURSE_UNTRACKED_DIRS |
                                                   GIT_STATUS_OPT_RENAMES_HEAD_TO_INDEX));
    EXPECT_EQ(options.baseline, nullptr);
    EXPECT_TRUE(walks_[0].hasCallback);
    EXPECT_TRUE(walks_[0].hasPayload);
}

TEST_F(StatusRecord, HoldsWhatLibGit2InitialisesOtherwise)
{
    git_status_options initialised;
    ASSERT_EQ(git_status_options_init(&initialised, GIT_STATUS_OPTIONS_VERSION), 0);
    adapter_->getFolderStates(adapter_->getRootFolder());
    ASSERT_EQ(walks_.size(), 1U);
    if (vclink::test::libgit2Release::setsRenameThreshold)
    {
        EXPECT_EQ(walks_[0].options.rename_threshold, initialised.rename_threshold);
    }
    EXPECT_EQ(walks_[0].options.version, initialised.version);
    EXPECT_EQ(walks_[0].options.baseline, initialised.baseline);
}

TEST_F(StatusRecord, HasTheWholeListInOneWalk)
{
    adapter_->getFileStates({asPath(repository_ / "z"), asPath(repository_ / "sub/a"),
                             asPath(repository_ / "#b"), asPath(repository_ / "z")});
    ASSERT_EQ(walks_.size(), 1U);
    EXPECT_THAT(walks_[0].pathspec, ElementsAre("z", "sub/a", "[#]b", "z"));
    EXPECT_EQ(walks_[0].options.flags, 0x95U);
}

TEST_F(StatusRecord, HasOnePatternForAFolder)
{
    adapter_->getFolderStates(asPath(repository_ / "sub/dir"));
    adapter_->getFolderStates(adapter_->getRootFolder());
    ASSERT_EQ(walks_.size(), 2U);
    EXPECT_THAT(walks_[0].pathspec, ElementsAre("sub/dir/*"));
    EXPECT_THAT(walks_[1].pathspec, ElementsAre("*"));
    EXPECT_EQ(walks_[0].repository, repository_.path().string() + "/");
}

TEST_F(StatusRecord, IsNotMadeForAnEmptyList)
{
    calls_.clear();
    EXPECT_TRUE(adapter_->getFileStates({}).empty());
    EXPECT_THAT(calls_.steps(), ElementsAre());
}

} // namespace
