// SPDX-License-Identifier: MIT
#include <stdexcept>
#include <string>

#include <boost/log/core.hpp>
#include <boost/log/sinks/basic_sink_backend.hpp>
#include <boost/log/sinks/sync_frontend.hpp>
#include <boost/log/sources/logger.hpp>
#include <boost/log/sources/record_ostream.hpp>
#include <boost/make_shared.hpp>
#include <gtest/gtest.h>

#include "examples/shell/logFailures.hpp"

namespace vclink::test
{
namespace
{

class FailingBackend
    : public boost::log::sinks::basic_sink_backend<boost::log::sinks::synchronized_feeding>
{
  public:
    void consume(const boost::log::record_view & /*record*/)
    {
        throw std::runtime_error("The folder is gone");
    }
};

class LogFailures : public testing::Test
{
  protected:
    LogFailures()
    {
        boost::log::core::get()->add_sink(sink_);
    }
    ~LogFailures() override
    {
        boost::log::core::get()->remove_sink(sink_);
        boost::log::core::get()->set_exception_handler(nullptr);
    }
    static void write()
    {
        boost::log::sources::logger logger;
        BOOST_LOG(logger) << "a record";
    }

  private:
    using Sink = boost::log::sinks::synchronous_sink<FailingBackend>;
    boost::shared_ptr<Sink> sink_ = boost::make_shared<Sink>();
};

TEST_F(LogFailures, LeaveTheLoggerUnlessTheyAreSurvived)
{
    EXPECT_THROW(write(), std::runtime_error);
}

TEST_F(LogFailures, AreReportedOnceAndLeaveNoLogger)
{
    shell::surviveLogFailures();
    testing::internal::CaptureStderr();
    EXPECT_NO_THROW(write());
    EXPECT_NO_THROW(write());
    EXPECT_EQ(testing::internal::GetCapturedStderr(),
              "vclink-shell: The log is incomplete: The folder is gone.\n");
}

} // namespace
} // namespace vclink::test
