// SPDX-License-Identifier: MIT
#include <string>
#include <thread>
#include <tuple>
#include <vector>

#include <boost/log/attributes/value_extraction.hpp>
#include <boost/log/core.hpp>
#include <boost/log/sinks/basic_sink_backend.hpp>
#include <boost/log/sinks/sync_frontend.hpp>
#include <boost/smart_ptr/make_shared_object.hpp>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "foundation/core/log/basic_diagnostic_logger.hpp"

namespace
{

namespace logging = boost::log;
using DiagnosticLogger = foundation::core::log::basic_diagnostic_logger<char>;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::SizeIs;

constexpr unsigned parameter = 0x02;
constexpr unsigned diagnostic = 0x08;

/// Severity, channel and message of a record, as a sink of Boost.Log gets them.
using Record = std::tuple<unsigned, std::string, std::string>;

class Recording : public logging::sinks::basic_sink_backend<logging::sinks::synchronized_feeding>
{
  public:
    void consume(const logging::record_view &record)
    {
        // extract() gives an empty reference, and get() asserts, for a value of another type.
        records.emplace_back(logging::extract<unsigned>("Severity", record).get(),
                             logging::extract<std::string>("Channel", record).get(),
                             logging::extract<std::string>("Message", record).get());
    }

    std::vector<Record> records;
};

class Logger : public testing::Test
{
  protected:
    Logger()
    {
        logging::core::get()->add_sink(sink_);
    }
    ~Logger() override
    {
        logging::core::get()->set_logging_enabled(true);
        logging::core::get()->remove_sink(sink_);
    }

    /// A write as the logger's users make it: the bit, the core, the record, and only then the
    /// text.
    /// @return whether the text was built
    bool write(unsigned severity, const std::string &text)
    {
        if (!logger.is_enabled(severity) || !logger.is_logging_enabled())
            return false;
        auto record = logger.open_record(severity);
        if (!record)
            return false;
        logger.push_record(std::move(record), text);
        return true;
    }
    const std::vector<Record> &records() const
    {
        return backend_->records;
    }

    DiagnosticLogger logger{"tests"};

  private:
    boost::shared_ptr<Recording> backend_ = boost::make_shared<Recording>();
    boost::shared_ptr<logging::sinks::synchronous_sink<Recording>> sink_ =
        boost::make_shared<logging::sinks::synchronous_sink<Recording>>(backend_);
};

TEST_F(Logger, HasNothingEnabledAtTheStartAndEachBitOnItsOwnLater)
{
    EXPECT_EQ(logger.name(), "tests");
    EXPECT_EQ(logger.enabled_severities(), 0U);
    EXPECT_FALSE(logger.is_enabled(~0U));
    logger.set_enabled_severities(parameter | 0x200);
    EXPECT_EQ(logger.enabled_severities(), 0x202U);
    EXPECT_TRUE(logger.is_enabled(parameter));
    EXPECT_TRUE(logger.is_enabled(0x200));
    EXPECT_FALSE(logger.is_enabled(diagnostic));
    logger.set_enabled_severities(0);
    EXPECT_FALSE(logger.is_enabled(parameter));
}

TEST_F(Logger, HandsTheSinksSeverityChannelAndMessage)
{
    logger.set_enabled_severities(parameter | diagnostic);
    EXPECT_TRUE(write(diagnostic, "caf\xC3\xA9 \xFF"));
    EXPECT_TRUE(write(parameter, ""));
    EXPECT_THAT(records(), ElementsAre(Record(diagnostic, "tests", "caf\xC3\xA9 \xFF"),
                                       Record(parameter, "tests", "")));
}

TEST_F(Logger, WritesNothingThatIsDisabledSwitchedOffOrNotPushed)
{
    logger.set_enabled_severities(diagnostic);
    EXPECT_FALSE(write(parameter, "disabled"));
    EXPECT_TRUE(logger.is_logging_enabled());
    logging::core::get()->set_logging_enabled(false);
    EXPECT_FALSE(logger.is_logging_enabled());
    EXPECT_FALSE(static_cast<bool>(logger.open_record(diagnostic)));
    EXPECT_FALSE(write(diagnostic, "switched off"));
    logging::core::get()->set_logging_enabled(true);
    EXPECT_TRUE(static_cast<bool>(logger.open_record(diagnostic)));
    EXPECT_THAT(records(), IsEmpty());
    EXPECT_TRUE(write(diagnostic, "text"));
    EXPECT_THAT(records(), SizeIs(1));
}

TEST_F(Logger, CountsTheScopesOfEachThreadApart)
{
    DiagnosticLogger other("tests.other");
    EXPECT_EQ(logger.scope_depth(), 0);
    logger.scope_depth() += 2;
    EXPECT_EQ(logger.scope_depth(), 2);
    EXPECT_EQ(other.scope_depth(), 0);
    int depthThere = -1;
    std::thread([&] { depthThere = logger.scope_depth()++; }).join();
    EXPECT_EQ(depthThere, 0);
    EXPECT_EQ(logger.scope_depth(), 2);
}

TEST_F(Logger, IsWrittenByManyThreadsAtOnce)
{
    constexpr int rounds = 200;
    logger.set_enabled_severities(diagnostic);
    const auto writeMany = [this]
    {
        for (int round = 0; round < rounds; ++round)
            write(diagnostic, "text");
    };
    std::thread one(writeMany);
    std::thread two(writeMany);
    one.join();
    two.join();
    EXPECT_THAT(records(), SizeIs(2 * rounds));
}

} // namespace
