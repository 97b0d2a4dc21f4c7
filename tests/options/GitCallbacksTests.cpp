// SPDX-License-Identifier: MIT
#include "options/GitCallbacks.hpp"

#include <cstring>
#include <memory>
#include <string>
#include <type_traits>
#include <utility>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "error/VirtualTable.hpp"
#include "support/TestInteractor.hpp"
#include "support/interposition.hpp"

namespace
{

/// What happened to a poller or the interactor, and where that lies.
struct Event
{
    std::string what;
    const void *object;
};
std::vector<Event> events;

constexpr const char *constructorName = "_ZN6vclink18PollableTerminatorC1ERNS_10TerminatorE";
constexpr const char *destructorName = "_ZN6vclink18PollableTerminatorD1Ev";

} // namespace

// This program's own definitions go before the host's constructor and destructor, which they note
// and call: a poller connects and disconnects there.
void connectPoller(void *poller, vclink::Terminator &source) __asm__(
    "_ZN6vclink18PollableTerminatorC1ERNS_10TerminatorE");
void disconnectPoller(void *poller) __asm__("_ZN6vclink18PollableTerminatorD1Ev");

void connectPoller(void *poller, vclink::Terminator &source)
{
    events.push_back({"connected", poller});
    vclink::test::findNext<void(void *, vclink::Terminator &)>(constructorName)(poller, source);
}

void disconnectPoller(void *poller)
{
    events.push_back({"disconnected", poller});
    vclink::test::findNext<void(void *)>(destructorName)(poller);
}

namespace vclink::git
{
namespace
{

using test::offsetIn;
using test::slotOf;

static_assert(std::is_abstract_v<GitCallbacks> && std::has_virtual_destructor_v<GitCallbacks>);
static_assert(sizeof(GitCallbacks) == sizeof(void *) + sizeof(std::shared_ptr<int>));
static_assert(!std::is_polymorphic_v<RemoteCallbacks> &&
              !std::is_polymorphic_v<ReservedCallbacks> &&
              !std::is_polymorphic_v<CheckoutCallbacks> && !std::is_polymorphic_v<ProxyCallbacks>);
static_assert(std::is_empty_v<ProxyCallbacks> &&
              sizeof(ReservedCallbacks) == sizeof(ApplicationInteractor *));
static_assert(sizeof(RemoteCallbacks) ==
                  sizeof(ApplicationInteractor *) + sizeof(CancellationPoller) &&
              sizeof(CheckoutCallbacks) ==
                  sizeof(ApplicationInteractor *) + sizeof(CancellationPoller));
static_assert(
    std::is_same_v<decltype(makeDefaultGitCallbacks(nullptr)), std::unique_ptr<GitCallbacks>>);

/// An application that notes its end, and how often it is asked for its source of cancellation.
class CountingInteractor : public test::TestInteractor
{
  public:
    ~CountingInteractor() override
    {
        events.push_back({"interactor gone", this});
    }
    Terminator &getTerminator() override
    {
        ++asked;
        return TestInteractor::getTerminator();
    }

    int asked = 0;
};

/// Whether an event happened to a part of a set.
template <class Set> bool happenedIn(const Event &event, const std::string &what, const void *set)
{
    const auto *const begin = static_cast<const char *>(set);
    const auto *const object = static_cast<const char *>(event.object);
    return event.what == what && object >= begin && object < begin + sizeof(Set);
}

class GitCallbacksTest : public testing::Test
{
  protected:
    GitCallbacksTest()
    {
        events.clear();
    }
};

TEST_F(GitCallbacksTest, HasItsSlotsInOrder)
{
    EXPECT_EQ(slotOf(&GitCallbacks::remoteCallbacks), 2u);
    EXPECT_EQ(slotOf(&GitCallbacks::reservedCallbacks), 3u);
    EXPECT_EQ(slotOf(&GitCallbacks::checkoutCallbacks), 4u);
    EXPECT_EQ(slotOf(&GitCallbacks::proxyCallbacks), 5u);
}

TEST_F(GitCallbacksTest, HoldsItsSetsByValueInOrder)
{
    const auto callbacks = makeDefaultGitCallbacks(std::make_shared<CountingInteractor>());
    const auto remote = offsetIn(*callbacks, callbacks->remoteCallbacks());
    const auto reserved = offsetIn(*callbacks, callbacks->reservedCallbacks());
    const auto checkout = offsetIn(*callbacks, callbacks->checkoutCallbacks());
    const auto proxy = offsetIn(*callbacks, callbacks->proxyCallbacks());
    const auto sizeOf = [](auto size) { return static_cast<std::ptrdiff_t>(size); };
    EXPECT_EQ(remote, sizeOf(sizeof(GitCallbacks)));
    EXPECT_EQ(reserved, remote + sizeOf(sizeof(RemoteCallbacks)));
    EXPECT_EQ(checkout, reserved + sizeOf(sizeof(ReservedCallbacks)));
    EXPECT_EQ(proxy, checkout + sizeOf(sizeof(CheckoutCallbacks)));
    // The same ones each time.
    EXPECT_EQ(&callbacks->remoteCallbacks(), &callbacks->remoteCallbacks());
    EXPECT_EQ(&callbacks->checkoutCallbacks(), &callbacks->checkoutCallbacks());
}

TEST_F(GitCallbacksTest, TakesOneShareOfTheInteractorAndReleasesIt)
{
    auto interactor = std::make_shared<CountingInteractor>();
    auto callbacks = makeDefaultGitCallbacks(interactor);
    EXPECT_EQ(interactor.use_count(), 2);
    callbacks.reset();
    EXPECT_EQ(interactor.use_count(), 1);
    callbacks = makeDefaultGitCallbacks(std::move(interactor));
    EXPECT_EQ(interactor, nullptr);
}

TEST_F(GitCallbacksTest, BeginsEachSetWithTheInteractor)
{
    const auto interactor = std::make_shared<CountingInteractor>();
    const ApplicationInteractor *const expected = interactor.get();
    const auto callbacks = makeDefaultGitCallbacks(interactor);
    const void *const sets[] = {&callbacks->remoteCallbacks(), &callbacks->reservedCallbacks(),
                                &callbacks->checkoutCallbacks()};
    for (const void *const set : sets)
    {
        const ApplicationInteractor *held = nullptr;
        std::memcpy(&held, set, sizeof(held));
        EXPECT_EQ(held, expected);
    }
}

TEST_F(GitCallbacksTest, ConnectsItsPollersWhenItIsMade)
{
    const auto interactor = std::make_shared<CountingInteractor>();
    const auto callbacks = makeDefaultGitCallbacks(interactor);
    EXPECT_EQ(interactor->asked, 2);
    ASSERT_EQ(events.size(), 2u);
    EXPECT_TRUE(happenedIn<RemoteCallbacks>(events[0], "connected", &callbacks->remoteCallbacks()));
    EXPECT_TRUE(
        happenedIn<CheckoutCallbacks>(events[1], "connected", &callbacks->checkoutCallbacks()));
}

TEST_F(GitCallbacksTest, DisconnectsTheCheckoutsPollerFirstAndReleasesTheInteractorLast)
{
    auto callbacks = makeDefaultGitCallbacks(std::make_shared<CountingInteractor>());
    const void *const remote = &callbacks->remoteCallbacks();
    const void *const checkout = &callbacks->checkoutCallbacks();
    events.clear();
    callbacks.reset();
    ASSERT_EQ(events.size(), 3u);
    EXPECT_TRUE(happenedIn<CheckoutCallbacks>(events[0], "disconnected", checkout));
    EXPECT_TRUE(happenedIn<RemoteCallbacks>(events[1], "disconnected", remote));
    EXPECT_EQ(events[2].what, "interactor gone");
}

/// Polls a set, whose poller is its last part.
template <class Set> bool pollSees(Set &set)
{
    auto *const poller = reinterpret_cast<PollableTerminator *>(
        reinterpret_cast<char *>(&set) + sizeof(Set) - sizeof(PollableTerminator));
    return poller->checkAndResetCancelledState();
}

TEST_F(GitCallbacksTest, RemembersARequestInEachSetByItself)
{
    const auto interactor = std::make_shared<CountingInteractor>();
    const auto callbacks = makeDefaultGitCallbacks(interactor);
    interactor->cancel();
    EXPECT_TRUE(pollSees(callbacks->remoteCallbacks()));
    EXPECT_FALSE(pollSees(callbacks->remoteCallbacks()));
    EXPECT_TRUE(pollSees(callbacks->checkoutCallbacks()));
    EXPECT_FALSE(pollSees(callbacks->checkoutCallbacks()));
}

} // namespace
} // namespace vclink::git
