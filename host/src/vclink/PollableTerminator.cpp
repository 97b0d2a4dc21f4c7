// SPDX-License-Identifier: MIT
#include "vclink/PollableTerminator.hpp"

#include <atomic>

#include <boost/signals2/connection.hpp>
#include <boost/signals2/signal.hpp>

#include "vclink_host/cancellation.hpp"

namespace vclink
{

struct Terminator::Impl
{
    boost::signals2::signal<void()> requested;
};

Terminator::Terminator() : impl_(std::make_unique<Impl>())
{
}

Terminator::~Terminator() = default;

Terminator::Impl &Terminator::impl() noexcept
{
    return *impl_;
}

struct PollableTerminator::Impl
{
    // Shared with the slot: a request on another thread can still run it while this object is
    // destroyed.
    std::shared_ptr<std::atomic<bool>> isRequested = std::make_shared<std::atomic<bool>>(false);
    boost::signals2::scoped_connection connection;
};

PollableTerminator::PollableTerminator(Terminator &source) : impl_(std::make_unique<Impl>())
{
    impl_->connection = source.impl().requested.connect([isRequested = impl_->isRequested]
                                                        { isRequested->store(true); });
}

PollableTerminator::~PollableTerminator() = default;

bool PollableTerminator::checkAndResetCancelledState() noexcept
{
    return impl_->isRequested->exchange(false);
}

} // namespace vclink

namespace vclink_host
{

void requestCancellation(vclink::Terminator &source)
{
    source.impl().requested();
}

} // namespace vclink_host
