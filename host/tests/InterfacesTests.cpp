// SPDX-License-Identifier: MIT
#include <cstddef>
#include <cstring>
#include <type_traits>

#include <gtest/gtest.h>

#include "foundation/core/except/IMsgIDException.hpp"
#include "vclink/ApplicationInteractor.hpp"
#include "vclink/CMAdapter.hpp"
#include "vclink/CMAdapterFactory.hpp"
#include "vclink/ProgressReporter.hpp"
#include "vclink/WorkingCopyGenerator.hpp"

namespace
{

template <class... Interfaces>
constexpr bool areDestroyedThroughTheirBase = (std::has_virtual_destructor_v<Interfaces> && ...);
static_assert(areDestroyedThroughTheirBase<
              vclink::CMAdapter, vclink::CMAdapterFactory, vclink::WorkingCopyGenerator,
              vclink::ApplicationInteractor, vclink::ProgressReporter>);

/// The slot of a virtual operation in the table, as the Itanium ABI encodes it in a pointer to the
/// member: the slot's offset in bytes, plus one.
template <class Pointer> std::ptrdiff_t slotOf(Pointer pointer)
{
    static_assert(std::is_member_function_pointer_v<Pointer>);
    std::ptrdiff_t encoded = 0;
    std::memcpy(&encoded, &pointer, sizeof encoded);
    EXPECT_EQ(encoded % static_cast<std::ptrdiff_t>(sizeof(void *)), 1) << "not virtual";
    return encoded / static_cast<std::ptrdiff_t>(sizeof(void *));
}

} // namespace

// The two entries of the destructor come first in the interfaces, so that the first operation has
// slot 2.

TEST(Interfaces, AdapterHasItsOperationsInOrder)
{
    using vclink::CMAdapter;
    EXPECT_EQ(slotOf(&CMAdapter::commit), 2);
    EXPECT_EQ(slotOf(&CMAdapter::addFiles), 3);
    EXPECT_EQ(slotOf(&CMAdapter::removeFiles), 4);
    EXPECT_EQ(slotOf(&CMAdapter::revertFiles), 5);
    EXPECT_EQ(slotOf(&CMAdapter::markResolved), 6);
    EXPECT_EQ(slotOf(&CMAdapter::getFileStates), 7);
    EXPECT_EQ(slotOf(&CMAdapter::getFolderStates), 8);
    EXPECT_EQ(slotOf(&CMAdapter::getRootFolder), 9);
}

TEST(Interfaces, AdapterFactoryHasItsOperationsInOrder)
{
    using vclink::CMAdapterFactory;
    EXPECT_EQ(slotOf(&CMAdapterFactory::createAdapterFor), 2);
    EXPECT_EQ(slotOf(&CMAdapterFactory::createWorkingCopyGenerator), 3);
    EXPECT_EQ(slotOf(&CMAdapterFactory::isAdapterFor), 4);
    EXPECT_EQ(slotOf(&CMAdapterFactory::getName), 5);
}

TEST(Interfaces, OthersHaveTheirOperationsInOrder)
{
    EXPECT_EQ(slotOf(&vclink::WorkingCopyGenerator::generate), 2);
    EXPECT_EQ(slotOf(&vclink::ApplicationInteractor::getTerminator), 2);
    EXPECT_EQ(slotOf(&vclink::ApplicationInteractor::getProgressReporter), 3);
    EXPECT_EQ(slotOf(&vclink::ProgressReporter::setProgress), 2);
    EXPECT_EQ(slotOf(&vclink::ProgressReporter::setProgressMessage), 3);
}

TEST(Interfaces, MessageExceptionHasItsOperationsInOrder)
{
    using foundation::core::except::IMsgIDException;
    using FromWide = ustring (IMsgIDException::*)(const ustring &) const;
    using FromNarrow = ustring (IMsgIDException::*)(const std::string &) const;
    EXPECT_EQ(slotOf(&IMsgIDException::clone), 0);
    EXPECT_EQ(slotOf(&IMsgIDException::rethrow), 1);
    // 2 and 3 are the destructor.
    EXPECT_EQ(slotOf(&IMsgIDException::what), 4);
    EXPECT_EQ(slotOf(static_cast<FromWide>(&IMsgIDException::convert_str)), 5);
    EXPECT_EQ(slotOf(static_cast<FromNarrow>(&IMsgIDException::convert_str)), 6);
    EXPECT_EQ(slotOf(&IMsgIDException::ToUstringImpl), 7);
    EXPECT_EQ(slotOf(&IMsgIDException::GetID), 8);
    EXPECT_EQ(slotOf(&IMsgIDException::GetUnicodeMessageTxt), 9);
    EXPECT_EQ(slotOf(&IMsgIDException::GetBaseMsgIDObj), 10);
}
