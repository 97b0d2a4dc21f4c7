// SPDX-License-Identifier: MIT
#pragma once

#include <deque>
#include <exception>
#include <functional>
#include <memory>
#include <shared_mutex>

#include <QObject>
#include <QString>

#include "Snapshot.hpp"
#include "Work.hpp"
#include "Worker.hpp"
#include "hostTools.hpp"

namespace vclink::desktop
{

/// What the person asks for.
struct Operation
{
    enum class Kind
    {
        Short,    ///< can't be cancelled
        Checkout, ///< can be cancelled until the first file is written
        Download, ///< can be cancelled while data comes, and until the first file is written
        Upload    ///< can't be cancelled: the server may have taken it already
    };

    QString title;
    Kind kind = Kind::Short;
    /// On the worker's thread.
    std::function<void(Work &)> run;
    /// After success. Both are called on the thread of the window.
    std::function<void()> done;
    /// After failure. Returns true if that is enough, and the listener need not report it.
    std::function<bool(const host_tools::Failure &)> failed;
};

/// What follows the operations, on the thread of the window.
struct RunnerListener
{
    /// Whether something runs, or whether it can be cancelled.
    std::function<void()> changed;
    std::function<void(double fraction, const QString &step)> progress;
    std::function<void(const Operation &, const host_tools::Failure &)> failed;
    std::function<void(const QString &)> told;
    std::function<void(std::shared_ptr<const Snapshot>)> refreshed;
};

/// Runs one operation at a time on the worker, and reads the states again after each.
class Runner : public QObject
{
  public:
    /// @param guards one for the process; see Work
    Runner(std::shared_mutex &guards, RunnerListener listener);
    ~Runner() override;

    void setRoot(const upath &root);
    const upath &root() const noexcept
    {
        return root_;
    }
    /// Begins as soon as nothing else runs.
    void run(Operation operation);
    /// The operation that runs, or null.
    const Operation *current() const noexcept
    {
        return operation_.get();
    }
    /// Whether nothing runs, and the states have been read since.
    bool isSettled() const noexcept
    {
        return operation_ == nullptr && waiting_.empty() && !isReading_ && !readsAgain_;
    }
    /// Whether cancel() would reach the operation.
    bool canCancel() const;
    void cancel();
    /// Reads the states soon; while an operation runs, after it.
    void refresh();

  private:
    void execute(const upath &root, const Operation &operation,
                 const std::shared_ptr<host_tools::Interactor> &interactor);
    void begin(Operation operation);
    void attached();
    void showProgress(double fraction, const ustring &message);
    void finish(const std::exception_ptr &failure);
    void readAgain();
    /// Runs on the thread of the window.
    void post(std::function<void()> function);

    std::shared_mutex &guards_;
    RunnerListener listener_;
    upath root_;
    std::shared_ptr<Operation> operation_;
    std::deque<Operation> waiting_;
    std::shared_ptr<host_tools::Interactor> interactor_;
    bool isAttached_ = false;
    bool isAsked_ = false;
    bool isReading_ = false;
    bool readsAgain_ = false;
    /// Ends first: its jobs use the rest.
    Worker worker_;
};

} // namespace vclink::desktop
