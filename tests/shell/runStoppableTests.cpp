// SPDX-License-Identifier: MIT
#include <chrono>
#include <csignal>
#include <functional>
#include <optional>
#include <stdexcept>
#include <thread>

#include <gtest/gtest.h>

#include "examples/shell/Output.hpp"
#include "examples/shell/ProgressLine.hpp"
#include "examples/shell/Session.hpp"
#include "examples/shell/runStoppable.hpp"
#include "vclink/PollableTerminator.hpp"
#include "vclink/util/exception/CancelledOperationException.hpp"

namespace vclink::test
{
namespace
{

using namespace std::chrono_literals;

class RunStoppable : public testing::Test
{
  protected:
    /// What is told of an operation, and the status it ends with.
    std::string tell(const std::function<void()> &operation)
    {
        testing::internal::CaptureStderr();
        status_ = shell::runStoppable(session_, shell::Stops::BeforeWriting, operation);
        return testing::internal::GetCapturedStderr();
    }
    /// Sends a signal, and goes on when the request has arrived.
    void ask(int signal = SIGINT)
    {
        PollableTerminator poller(session_.interactor()->getTerminator());
        std::raise(signal);
        const auto end = std::chrono::steady_clock::now() + 30s;
        while (!poller.checkAndResetCancelledState())
        {
            ASSERT_LT(std::chrono::steady_clock::now(), end) << "nothing was asked";
            std::this_thread::yield();
        }
    }

    shell::Output output_;
    shell::ProgressLine line_{true};
    shell::Session session_{output_, line_};
    int status_ = -1;
};

TEST_F(RunStoppable, IsDoneWhenTheOperationIs)
{
    EXPECT_EQ(tell([] {}), "");
    EXPECT_EQ(status_, 0);
}

TEST_F(RunStoppable, IsDoneWhenTheOperationIsInSpiteOfBeingAskedToStop)
{
    EXPECT_EQ(tell([this] { ask(); }), "");
    EXPECT_EQ(status_, 0);
}

TEST_F(RunStoppable, EndsAsCancelledForAnyFailureAfterThePersonAskedToStop)
{
    EXPECT_EQ(tell(
                  [this]
                  {
                      ask();
                      throw util::exception::CancelledOperationException();
                  }),
              "vclink-shell: The operation was cancelled.\n");
    EXPECT_EQ(status_, 130);
    EXPECT_EQ(tell(
                  [this]
                  {
                      ask();
                      throw std::runtime_error("It broke.");
                  }),
              "vclink-shell: It broke.\n");
    EXPECT_EQ(status_, 130);
}

TEST_F(RunStoppable, LetsTheProgramEndAsBySigtermOrSighupWhateverBecameOfTheOperation)
{
    for (const int signal : {SIGTERM, SIGHUP})
    {
        EXPECT_EQ(tell([&] { ask(signal); }), "");
        EXPECT_EQ(status_, 0);
        EXPECT_EQ(session_.endingSignal(), signal);
        EXPECT_EQ(tell(
                      [&]
                      {
                          ask(signal);
                          throw util::exception::CancelledOperationException();
                      }),
                  "vclink-shell: The operation was cancelled.\n");
        EXPECT_EQ(status_, 128 + signal);
        EXPECT_EQ(session_.endingSignal(), signal);
    }
}

TEST_F(RunStoppable, LeavesTheProgramsStatusToTheCommandAfterCtrlC)
{
    tell([this] { ask(); });
    EXPECT_EQ(session_.endingSignal(), std::nullopt);
}

TEST_F(RunStoppable, LeavesOtherFailuresToTheCaller)
{
    EXPECT_THROW(shell::runStoppable(session_, shell::Stops::Never,
                                     [] { throw std::runtime_error("It broke."); }),
                 std::runtime_error);
}

TEST_F(RunStoppable, TakesTheLineOfProgressAwayBeforeItTells)
{
    const std::string drawn = "\r\33[K[--------------------]   0% file";
    const std::string text = tell(
        [this]
        {
            session_.interactor()->getProgressReporter()->setProgressMessage(u"file");
            ask();
            throw util::exception::CancelledOperationException();
        });
    EXPECT_EQ(text, drawn + "\r\33[Kvclink-shell: The operation was cancelled.\n");
}

} // namespace
} // namespace vclink::test
