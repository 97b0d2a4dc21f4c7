// SPDX-License-Identifier: MIT
#include "options/CancellationPoller.hpp"

#include <optional>
#include <typeinfo>

#include <gtest/gtest.h>

#include "support/TestInteractor.hpp"
#include "vclink/util/exception/CancelledOperationException.hpp"

namespace vclink::git
{
namespace
{

using test::TestInteractor;
using vclink::util::exception::CancelledOperationException;

static_assert(sizeof(CancellationPoller) ==
              sizeof(ApplicationInteractor *) + sizeof(PollableTerminator));

TEST(CancellationPoller, RaisesTheHostsExceptionWithItsStackOncePerRequest)
{
    TestInteractor interactor;
    CancellationPoller poller(interactor);
    EXPECT_NO_THROW(poller.throwIfCancelled());
    interactor.cancel();
    interactor.cancel();
    try
    {
        poller.throwIfCancelled();
        ADD_FAILURE() << "nothing was raised";
    }
    catch (const computils::exception::StackTraceRecordingException &exception)
    {
        EXPECT_EQ(typeid(exception), typeid(CancelledOperationException));
        EXPECT_GT(exception.getStackTrace().size(), 0u);
    }
    EXPECT_NO_THROW(poller.throwIfCancelled());
    interactor.cancel();
    EXPECT_THROW(poller.throwIfCancelled(), CancelledOperationException);
}

TEST(CancellationPoller, ListensToItsOwnSourceFromItsMakingOnWithAMemoryOfItsOwn)
{
    TestInteractor interactor;
    TestInteractor other;
    interactor.cancel();
    CancellationPoller one(interactor);
    CancellationPoller two(interactor);
    other.cancel();
    EXPECT_NO_THROW(one.throwIfCancelled());
    interactor.cancel();
    for (CancellationPoller *const poller : {&one, &two})
    {
        EXPECT_THROW(poller->throwIfCancelled(), CancelledOperationException);
        EXPECT_NO_THROW(poller->throwIfCancelled());
    }
}

TEST(CancellationPoller, MayEndBeforeItsSource)
{
    TestInteractor interactor;
    std::optional<CancellationPoller> poller(std::in_place, interactor);
    poller.reset();
    EXPECT_NO_THROW(interactor.cancel());
}

} // namespace
} // namespace vclink::git
