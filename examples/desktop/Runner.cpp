// SPDX-License-Identifier: MIT
#include "Runner.hpp"

#include <exception>
#include <utility>

#include <QMetaObject>

#include "language.hpp"
#include "messages.hpp"
#include "text.hpp"
#include "vclink_host/cancellation.hpp"

namespace vclink::desktop
{

Runner::Runner(std::shared_mutex &guards, RunnerListener listener)
    : guards_(guards), listener_(std::move(listener))
{
}

Runner::~Runner() = default;

void Runner::setRoot(const upath &root)
{
    root_ = root;
    refresh();
}

void Runner::run(Operation operation)
{
    if (operation_ == nullptr)
        begin(std::move(operation));
    else
        waiting_.push_back(std::move(operation));
}

void Runner::begin(Operation operation)
{
    operation_ = std::make_shared<Operation>(std::move(operation));
    isAttached_ = isAsked_ = false;
    interactor_ = std::make_shared<host_tools::Interactor>(
        [this](double fraction, const ustring &message)
        { post([this, fraction, message] { showProgress(fraction, message); }); });
    worker_.post([this, root = root_, operation = operation_, interactor = interactor_]
                 { execute(root, *operation, interactor); });
    listener_.changed();
}

void Runner::execute(const upath &root, const Operation &operation,
                     const std::shared_ptr<host_tools::Interactor> &interactor)
{
    std::exception_ptr failure;
    try
    {
        Work work(guards_, root, interactor, [this] { post([this] { attached(); }); });
        operation.run(work);
    }
    catch (...)
    {
        failure = std::current_exception();
    }
    post([this, failure] { finish(failure); });
}

bool Runner::canCancel() const
{
    return operation_ != nullptr && isAttached_ && !isAsked_ && !interactor_->isWriting() &&
           (operation_->kind == Operation::Kind::Checkout ||
            operation_->kind == Operation::Kind::Download);
}

void Runner::cancel()
{
    if (!canCancel())
        return;
    isAsked_ = true;
    vclink_host::requestCancellation(interactor_->getTerminator());
    listener_.changed();
}

void Runner::attached()
{
    isAttached_ = true;
    listener_.changed();
}

void Runner::showProgress(double fraction, const ustring &message)
{
    listener_.progress(fraction, printable(message));
    listener_.changed();
}

void Runner::finish(const std::exception_ptr &failure)
{
    const auto operation = std::exchange(operation_, nullptr);
    const bool isAsked = isAsked_;
    refresh();
    if (failure == nullptr)
    {
        if (isAsked)
            listener_.told(say("Too late to cancel: it was done already."));
        if (operation->done)
            operation->done();
    }
    else
    {
        auto described = host_tools::describe(failure);
        // A merge has no exception of its own for it: only the host knows that it has asked.
        if (isAsked && described.kind == host_tools::FailureKind::MergeFailed)
            described.kind = host_tools::FailureKind::Cancelled;
        if (!operation->failed || !operation->failed(described))
            listener_.failed(*operation, described);
    }
    if (operation_ == nullptr && !waiting_.empty())
    {
        Operation next = std::move(waiting_.front());
        waiting_.pop_front();
        begin(std::move(next));
    }
    // Last, as a window that waits for the end closes now.
    listener_.changed();
}

void Runner::refresh()
{
    readsAgain_ = true;
    readAgain();
}

void Runner::readAgain()
{
    if (operation_ != nullptr || isReading_ || !readsAgain_ || root_.string().empty())
        return;
    isReading_ = true;
    readsAgain_ = false;
    worker_.post(
        [this, root = root_]
        {
            std::shared_ptr<const Snapshot> snapshot;
            std::exception_ptr failure;
            try
            {
                Work work(guards_, root,
                          std::make_shared<host_tools::Interactor>([](double, const ustring &) {}),
                          [] {});
                snapshot = std::make_shared<Snapshot>(readSnapshot(work));
            }
            catch (...)
            {
                failure = std::current_exception();
            }
            post(
                [this, snapshot, failure]
                {
                    isReading_ = false;
                    if (snapshot == nullptr)
                        listener_.told(textOf(host_tools::describe(failure)));
                    else if (snapshot->root == root_)
                        listener_.refreshed(snapshot);
                    readAgain();
                });
        });
}

void Runner::post(std::function<void()> function)
{
    QMetaObject::invokeMethod(this, std::move(function), Qt::QueuedConnection);
}

} // namespace vclink::desktop
