// SPDX-License-Identifier: MIT
// The layout of the exceptions, which hosts that were built apart count on.
#include <cstddef>
#include <cstring>
#include <string>
#include <type_traits>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "error/VirtualTable.hpp"
#include "error/raise.hpp"
#include "vclink/git/GitException.hpp"
#include "vclink/git/LibGit2Exception.hpp"
#include "vclink/git/messageIdentifiers.hpp"
#include "vclink/util/exception/CancelledOperationException.hpp"

namespace vclink::git
{
namespace
{

using computils::exception::StackTraceRecordingException;
using foundation::core::diag::stacktrace_base;
using foundation::core::except::IException;
using foundation::core::except::IMsgIDException;
using foundation::core::except::IUserException;
using resource_core::BaseMsgID;
using resource_core::GenericMsgIDHolder;
using shared_vclink::git::HasConflicts;
using shared_vclink::git::MergeFailed;
using test::offsetIn;
using test::slotOf;
using test::virtualTableOf;
using testing::AnyOf;
using testing::Each;
using testing::ElementsAre;
using testing::IsSupersetOf;
using testing::Le;
using vclink::exception::SourceControlException;
using HasConflictsException = TagException<HasConflicts>;

static_assert(std::is_same_v<
              HasConflictsException,
              foundation::core::except::Exception<HasConflicts, SourceControlException, void>>);

template <class Derived, class Base>
constexpr bool derives =
    std::is_base_of_v<Base, Derived> &&std::is_convertible_v<Derived *, Base *>;
static_assert(derives<IUserException, IException> && derives<IMsgIDException, IUserException> &&
              derives<IMsgIDException, boost::exception>);
static_assert(
    derives<StackTraceRecordingException, std::exception> &&
    derives<SourceControlException, StackTraceRecordingException> &&
    derives<vclink::util::exception::CancelledOperationException, StackTraceRecordingException>);
static_assert(derives<GitException, IMsgIDException> &&
              derives<GitException, SourceControlException> &&
              derives<LibGit2Exception, GitException>);
static_assert(derives<HasConflictsException, IMsgIDException> &&
              derives<HasConflictsException, SourceControlException> &&
              !derives<HasConflictsException, GitException>);
static_assert(derives<GenericMsgIDHolder::EmptyGenericMsgIDHolder, std::exception>);

constexpr std::size_t roomForFrames = 128 * sizeof(void *);
static_assert(stacktrace_base::capacity == 128 && sizeof(stacktrace_base) >= roomForFrames);
static_assert(sizeof(GitException) >= roomForFrames &&
              sizeof(HasConflictsException) >= roomForFrames);

constexpr std::size_t slots = 11;

/// The slots in which two tables differ.
std::vector<std::size_t> differences(const std::vector<const void *> &one,
                                     const std::vector<const void *> &two)
{
    std::vector<std::size_t> different;
    for (std::size_t slot = 0; slot < one.size(); ++slot)
    {
        if (one[slot] != two[slot])
            different.push_back(slot);
    }
    return different;
}

/// A message exception that overrides what it must, so that its table shows what is inherited.
struct Inheriting : IMsgIDException
{
    const Inheriting *clone() const override
    {
        return nullptr;
    }
    void rethrow() const override
    {
    }
    std::string GetID() const override
    {
        return {};
    }
    const BaseMsgID &GetBaseMsgIDObj() const override
    {
        static const HasConflicts message;
        return message;
    }
};

/// The slots of destructor and deleting destructor lie between rethrow's and what's.
template <class Exception> void expectOrderOfSlots()
{
    EXPECT_EQ(slotOf(&Exception::clone), 0u);
    EXPECT_EQ(slotOf(&Exception::rethrow), 1u);
    EXPECT_EQ(slotOf(&Exception::what), 4u);
    EXPECT_EQ(
        slotOf(static_cast<ustring (Exception::*)(const ustring &) const>(&Exception::convert_str)),
        5u);
    EXPECT_EQ(slotOf(static_cast<ustring (Exception::*)(const std::string &) const>(
                  &Exception::convert_str)),
              6u);
    EXPECT_EQ(slotOf(&Exception::ToUstringImpl), 7u);
    EXPECT_EQ(slotOf(&Exception::GetID), 8u);
    EXPECT_EQ(slotOf(&Exception::GetUnicodeMessageTxt), 9u);
    EXPECT_EQ(slotOf(&Exception::GetBaseMsgIDObj), 10u);
}

TEST(ExceptionLayout, HasTheSameOrderOfSlotsInEveryClass)
{
    expectOrderOfSlots<GitException>();
    expectOrderOfSlots<LibGit2Exception>();
    expectOrderOfSlots<HasConflictsException>();
}

TEST(ExceptionLayout, OverridesAndInheritsTheseSlots)
{
    const auto inheriting = virtualTableOf(Inheriting(), slots);
    const auto ofGit = virtualTableOf(GitException{HasConflicts()}, slots);
    const auto ofLibGit2 = virtualTableOf(LibGit2Exception{GitError()}, slots);
    const auto ofTag =
        virtualTableOf(HasConflictsException(HasConflicts(), SourceControlException{}), slots);
    EXPECT_THAT(differences(ofGit, ofLibGit2), ElementsAre(0, 1, 2, 3));
    EXPECT_THAT(differences(inheriting, ofGit), ElementsAre(0, 1, 2, 3, 4, 8, 9, 10));
    // Whether what() is its own is the host's affair.
    EXPECT_THAT(differences(inheriting, ofTag), IsSupersetOf({0, 1, 2, 3, 8, 10}));
    EXPECT_THAT(differences(inheriting, ofTag), Each(AnyOf(Le(4), 8, 10)));
}

template <class Exception> void expectOrderOfBases(const Exception &exception)
{
    EXPECT_EQ(offsetIn(exception, static_cast<const IMsgIDException &>(exception)), 0);
    EXPECT_EQ(offsetIn(exception, static_cast<const IUserException &>(exception)), 0);
    EXPECT_GE(offsetIn(exception, static_cast<const SourceControlException &>(exception)),
              static_cast<std::ptrdiff_t>(sizeof(IMsgIDException)));
}

TEST(ExceptionLayout, BeginsWithTheMessageAndGoesOnWithTheStack)
{
    expectOrderOfBases(GitException{HasConflicts()});
    expectOrderOfBases(HasConflictsException(HasConflicts(), SourceControlException{}));
}

TEST(ExceptionLayout, OfARecordingExceptionHoldsTextThenFrames)
{
    const StackTraceRecordingException exception;
    EXPECT_EQ(offsetIn(exception, exception.getText()),
              static_cast<std::ptrdiff_t>(sizeof(std::exception)));
    EXPECT_EQ(offsetIn(exception, exception.getStackTrace()),
              static_cast<std::ptrdiff_t>(sizeof(std::exception) + sizeof(ustring)));
}

TEST(ExceptionLayout, EndsWithWhatTheClassAdds)
{
    const GitException git{HasConflicts()};
    const std::size_t holder = sizeof(GitException) - sizeof(ustring) - sizeof(GenericMsgIDHolder);
    const void *held = nullptr;
    static_assert(sizeof(GenericMsgIDHolder) == sizeof(held));
    std::memcpy(&held, reinterpret_cast<const char *>(&git) + holder, sizeof(held));
    EXPECT_EQ(held, &git.GetBaseMsgIDObj());
    const LibGit2Exception libGit2{GitError()};
    EXPECT_EQ(offsetIn(libGit2, libGit2.getError()),
              static_cast<std::ptrdiff_t>(sizeof(GitException)));
    EXPECT_EQ(sizeof(LibGit2Exception), sizeof(GitException) + sizeof(GitError));
    const HasConflictsException tag(HasConflicts(), SourceControlException{});
    EXPECT_EQ(static_cast<std::size_t>(offsetIn(tag, tag.GetBaseMsgIDObj())),
              sizeof(HasConflictsException) - sizeof(std::string) - sizeof(BaseMsgID));
}

TEST(ExceptionLayout, OfAMessageHoldsArgumentsCatalogueAndKeyInThisOrder)
{
    const MergeFailed message("topic");
    EXPECT_LT(offsetIn(message, message.getArguments()), offsetIn(message, message.getCatalogue()));
    EXPECT_LT(offsetIn(message, message.getCatalogue()), offsetIn(message, message.getKey()));
    EXPECT_EQ(sizeof(MergeFailed), sizeof(BaseMsgID));
}

/// Makes an exception this many calls further down.
[[gnu::noinline]] std::size_t framesRecordedBelow(int calls)
{
    if (calls == 0)
    {
        return GitException(HasConflicts()).getStackTrace().size();
    }
    const std::size_t frames = framesRecordedBelow(calls - 1);
    // Something to do after the call, so that it needs a frame.
    return frames != 0 ? frames : static_cast<std::size_t>(calls);
}

TEST(ExceptionLayout, HoldsTheInnermostFramesOfADeepStack)
{
    EXPECT_EQ(framesRecordedBelow(300), 128u);
    EXPECT_LT(framesRecordedBelow(1), 128u);
}

} // namespace
} // namespace vclink::git
