// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <memory>
#include <string>

#include <QPlainTextEdit>
#include <QTimer>

namespace vclink::desktop
{

/// Passes the library's records to a function while it lives. Ignores what the function throws: an
/// exception of a sink would leave the operation that writes the record, or end the process if a
/// destructor writes it.
class LogSink
{
  public:
    /// @param take called on whichever thread writes the record, one call at a time
    explicit LogSink(std::function<void(const std::string &)> take);
    LogSink(const LogSink &) = delete;
    LogSink &operator=(const LogSink &) = delete;
    ~LogSink();

  private:
    struct Impl;
    std::unique_ptr<Impl> impl_;
};

/// Shows the last records. Which ones are written is set with setSeverities.
class LogPane : public QPlainTextEdit
{
  public:
    explicit LogPane(QWidget *parent);
    ~LogPane() override;

    /// What the library writes from now on; 0 for nothing, which costs nothing.
    static void setSeverities(unsigned mask);
    static constexpr unsigned decisions = 0x08 | 0x10;
    static constexpr unsigned everything = 0x27E;

  private:
    void showNew();

    struct Waiting;
    std::shared_ptr<Waiting> waiting_;
    QTimer timer_;
    LogSink sink_;
};

} // namespace vclink::desktop
