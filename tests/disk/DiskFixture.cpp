// SPDX-License-Identifier: MIT
#include "DiskFixture.hpp"

#include <algorithm>
#include <iostream>
#include <iterator>

#include <gmock/gmock.h>
#include <unistd.h>

#include "support/UnprivilegedUser.hpp"
#include "support/strings.hpp"

namespace vclink::test
{
namespace
{

namespace fs = std::filesystem;

void takeBack(const fs::path &path)
{
    if (::lchown(path.c_str(), ::getuid(), ::getgid()) != 0)
        ADD_FAILURE() << path;
    if (!fs::is_symlink(path) && fs::is_directory(path))
    {
        for (const auto &entry : fs::directory_iterator(path))
            takeBack(entry.path());
    }
}

/// An error of libgit2 has its class and its text; a merge wraps it. The reader of a folder that
/// cannot be entered throws the standard library's exception.
bool isTyped(const std::string &outcome)
{
    if (startsWith(outcome, "vclink::git::LibGit2Exception "))
        return outcome.find(", class 0:") == std::string::npos && outcome.back() != ' ';
    return startsWith(outcome, "vclink::git::GitException: ") ||
           startsWith(outcome, "foundation::core::except::Exception<") ||
           startsWith(outcome, "boost::filesystem::filesystem_error: ");
}

} // namespace

std::vector<Operation> operationsThatWrite()
{
    std::vector<Operation> operations;
    std::copy_if(allOperations().begin(), allOperations().end(), std::back_inserter(operations),
                 [](const Operation &operation)
                 { return operation.writes && !startsWith(operation.name, "read"); });
    return operations;
}

std::string nameOfOperation(const testing::TestParamInfo<Operation> &test)
{
    return test.param.name;
}

void DiskFixture::prepare(const fs::path &folder)
{
    trial_ = std::make_unique<Trial>(GetParam(), folder, environment());
    trial_->begin();
    files_ = uncommittedFiles(trial_->repository());
    before_ = userWork(trial_->repository(), files_);
    gistBefore_ = trial_->gist();
    outcomeOf(trial_->begin());
    normal_ = userWork(trial_->repository(), files_);
}

void DiskFixture::tryOnce(const std::function<std::string(const Action &)> &run,
                          const std::vector<std::string> &otherGists,
                          const std::vector<std::string> &losses)
{
    const Action action = trial_->begin();
    const std::string outcome = run(action);
    SCOPED_TRACE(outcome);
    const bool hasFailed = outcome != trial_->normalOutcome();
    ++trials_;
    failures_ += hasFailed ? 1 : 0;
    if (hasFailed)
    {
        EXPECT_TRUE(isTyped(outcome));
    }
    else if (const std::string gist = trial_->gist(); gist != trial_->normalGist())
    {
        EXPECT_THAT(otherGists, testing::Contains(gist));
    }
    EXPECT_THAT(losses, testing::IsSupersetOf(lost()));
    expectNothingLeft();
    trial_->expectWorksAgain(action);
}

std::string DiskFixture::runInChild(const Action &action) const
{
    const std::vector<fs::path> places{trial_->repository().path().parent_path(),
                                       environment().home(), environment().temporary()};
    for (const auto &place : places)
        giveToUnprivilegedUser(place);
    const std::string outcome = runAsUnprivilegedUser([&] { return outcomeOf(action); });
    if (runsAsRoot())
        std::for_each(places.begin(), places.end(), takeBack);
    return outcome;
}

void DiskFixture::TearDown()
{
    std::cout << GetParam().name << ": " << failures_ << " of " << trials_ << " failed\n";
}

std::vector<std::string> DiskFixture::lost() const
{
    return lostWork(before_, normal_, userWork(trial_->repository(), files_));
}

void DiskFixture::expectNothingLeft() const
{
    trial_->expectSound();
    EXPECT_TRUE(fs::is_empty(environment().temporary()));
    // libgit2's temporary files.
    for (const auto &entry :
         fs::recursive_directory_iterator(trial_->repository().path().parent_path()))
        EXPECT_EQ(entry.path().filename().string().find("git2_"), std::string::npos) << entry;
}

} // namespace vclink::test
