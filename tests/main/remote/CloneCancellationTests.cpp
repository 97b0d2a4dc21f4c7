// SPDX-License-Identifier: MIT
// A clone that is stopped, and what is left of it.
#include <algorithm>
#include <filesystem>
#include <string>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "CloneFixture.hpp"
#include "error/logging/severity.hpp"
#include "support/LogCapture.hpp"
#include "support/cancelAt.hpp"

namespace
{

namespace git = vclink::git;
using testing::Contains;
using testing::Not;
using testing::StartsWith;
using namespace vclink::test;

class CloneCancellation : public CloneFixture
{
  protected:
    bool isThere() const
    {
        return std::filesystem::exists(clone_.path());
    }
};

TEST_F(CloneCancellation, AskedForBeforeStopsTheTransferOrTheCheckoutWhereNothingIsTransferred)
{
    const LogCapture log(git::SeverityProgress);
    interactor_->cancel();
    expectCancelled([this] { generate(); });
    EXPECT_THAT(log.messages(), testing::IsEmpty());
    EXPECT_FALSE(isThere());
    expectCancelled([this] { generate(server_.path(), clone_.path()); });
    EXPECT_FALSE(isThere());
}

TEST_F(CloneCancellation, DuringTheTransferEmptiesAFolderThatWasThere)
{
    std::filesystem::create_directory(clone_.path());
    LogCapture log(git::SeverityProgress);
    cancelAt(log, *interactor_, "Transfer Progress");
    expectCancelled([this] { generate(); });
    EXPECT_THAT(log.messages(), Not(Contains(StartsWith("Checkout"))));
    ASSERT_TRUE(isThere());
    EXPECT_TRUE(std::filesystem::is_empty(clone_.path()));
}

TEST_F(CloneCancellation, DuringTheCheckoutStopsAtTheNextFile)
{
    LogCapture log(git::SeverityProgress);
    cancelAt(log, *interactor_, "Checkout Notify", 2);
    expectCancelled([this] { generate(); });
    const auto messages = log.messages();
    EXPECT_EQ(std::count_if(messages.begin(), messages.end(),
                            [](const std::string &message)
                            { return message.compare(0, 15, "Checkout Notify") == 0; }),
              2);
    EXPECT_FALSE(isThere());
}

/// The transfer has seen the request, the checkout has not.
TEST_F(CloneCancellation, DuringTheTransferStopsTheNextCloneAtItsFirstFile)
{
    LogCapture log(git::SeverityProgress);
    cancelAt(log, *interactor_, "Transfer Progress");
    expectCancelled([this] { generate(); });
    EXPECT_FALSE(isThere());
    log.onRecord(nullptr);
    log.clear();
    expectCancelled([this] { generate(); });
    EXPECT_THAT(log.messages(), Contains(StartsWith("Transfer Progress")));
    EXPECT_THAT(log.messages(), Not(Contains(StartsWith("Checkout Notify"))));
    EXPECT_FALSE(isThere());
    generate();
    expectCloned(clone_);
}

/// The checkout has seen the request, the transfer has not.
TEST_F(CloneCancellation, DuringTheCheckoutStopsTheTransferOfTheNextClone)
{
    LogCapture log(git::SeverityProgress);
    cancelAt(log, *interactor_, "Checkout Notify");
    expectCancelled([this] { generate(); });
    log.onRecord(nullptr);
    log.clear();
    expectCancelled([this] { generate(); });
    EXPECT_THAT(log.messages(), testing::IsEmpty());
    generate();
    expectCloned(clone_);
}

} // namespace
