// SPDX-License-Identifier: MIT
#include "LogPane.hpp"

#include <mutex>
#include <utility>
#include <vector>

#include <boost/log/attributes/value_extraction.hpp>
#include <boost/log/core.hpp>
#include <boost/log/expressions.hpp>
#include <boost/log/sinks/basic_sink_backend.hpp>
#include <boost/log/sinks/sync_frontend.hpp>
#include <boost/log/utility/exception_handler.hpp>
#include <boost/make_shared.hpp>

#include "text.hpp"
#include "vclink_host/logging.hpp"

namespace vclink::desktop
{
namespace
{

namespace logs = boost::log;

constexpr int lineLimit = 5'000;
constexpr int showMilliseconds = 100;

} // namespace

class LogBackend : public logs::sinks::basic_sink_backend<logs::sinks::synchronized_feeding>
{
  public:
    explicit LogBackend(std::function<void(const std::string &)> take) : take_(std::move(take))
    {
    }
    void consume(const logs::record_view &record)
    {
        if (const auto message = logs::extract<std::string>("Message", record))
            take_(message.get());
    }

  private:
    std::function<void(const std::string &)> take_;
};

using LogSinkFrontend = logs::sinks::synchronous_sink<LogBackend>;

struct LogSink::Impl
{
    boost::shared_ptr<LogSinkFrontend> sink;
};

LogSink::LogSink(std::function<void(const std::string &)> take)
    : impl_(std::make_unique<Impl>(Impl{
          boost::make_shared<LogSinkFrontend>(boost::make_shared<LogBackend>(std::move(take)))}))
{
    impl_->sink->set_filter(logs::expressions::attr<std::string>("Channel") == "vclink::git");
    impl_->sink->set_exception_handler(logs::make_exception_suppressor());
    logs::core::get()->add_sink(impl_->sink);
}

LogSink::~LogSink()
{
    logs::core::get()->remove_sink(impl_->sink);
}

/// Records come in bursts on the worker's thread, and are shown a few times a second.
struct LogPane::Waiting
{
    std::mutex mutex;
    std::vector<std::string> lines;
};

LogPane::LogPane(QWidget *parent)
    : QPlainTextEdit(parent), waiting_(std::make_shared<Waiting>()),
      sink_(
          [waiting = waiting_](const std::string &line)
          {
              const std::lock_guard lock(waiting->mutex);
              if (waiting->lines.size() < lineLimit)
                  waiting->lines.push_back(line);
          })
{
    setReadOnly(true);
    setMaximumBlockCount(lineLimit);
    setLineWrapMode(QPlainTextEdit::NoWrap);
    timer_.setInterval(showMilliseconds);
    connect(&timer_, &QTimer::timeout, this, [this] { showNew(); });
    timer_.start();
}

LogPane::~LogPane()
{
    setSeverities(0);
}

void LogPane::setSeverities(unsigned mask)
{
    vclink_host::setEnabledSeverities("vclink::git", mask);
}

void LogPane::showNew()
{
    std::vector<std::string> lines;
    {
        const std::lock_guard lock(waiting_->mutex);
        lines.swap(waiting_->lines);
    }
    for (const auto &record : lines)
    {
        for (const auto &line : fromUtf8(record).split(u'\n'))
            appendPlainText(printable(toUstring(line)));
    }
}

} // namespace vclink::desktop
