// SPDX-License-Identifier: MIT
#include <type_traits>

#include <gtest/gtest.h>

#include "error/VirtualTable.hpp"
#include "foundation/core/except/IMsgIDException.hpp"
#include "vclink/ApplicationInteractor.hpp"
#include "vclink/CMAdapter.hpp"
#include "vclink/CMAdapterFactory.hpp"
#include "vclink/ProgressReporter.hpp"
#include "vclink/WorkingCopyGenerator.hpp"

namespace
{

using vclink::test::slotOf;

template <class... Interfaces>
constexpr bool areDestroyedThroughTheirBase = (std::has_virtual_destructor_v<Interfaces> && ...);
static_assert(areDestroyedThroughTheirBase<
              vclink::CMAdapter, vclink::CMAdapterFactory, vclink::WorkingCopyGenerator,
              vclink::ApplicationInteractor, vclink::ProgressReporter>);

} // namespace

// The two entries of the destructor come first in the interfaces, so that the first operation has
// slot 2.

TEST(Interfaces, AdapterHasItsOperationsInOrder)
{
    using vclink::CMAdapter;
    EXPECT_EQ(slotOf(&CMAdapter::commit), 2u);
    EXPECT_EQ(slotOf(&CMAdapter::addFiles), 3u);
    EXPECT_EQ(slotOf(&CMAdapter::removeFiles), 4u);
    EXPECT_EQ(slotOf(&CMAdapter::revertFiles), 5u);
    EXPECT_EQ(slotOf(&CMAdapter::markResolved), 6u);
    EXPECT_EQ(slotOf(&CMAdapter::getFileStates), 7u);
    EXPECT_EQ(slotOf(&CMAdapter::getFolderStates), 8u);
    EXPECT_EQ(slotOf(&CMAdapter::getRootFolder), 9u);
}

TEST(Interfaces, AdapterFactoryHasItsOperationsInOrder)
{
    using vclink::CMAdapterFactory;
    EXPECT_EQ(slotOf(&CMAdapterFactory::createAdapterFor), 2u);
    EXPECT_EQ(slotOf(&CMAdapterFactory::createWorkingCopyGenerator), 3u);
    EXPECT_EQ(slotOf(&CMAdapterFactory::isAdapterFor), 4u);
    EXPECT_EQ(slotOf(&CMAdapterFactory::getName), 5u);
}

TEST(Interfaces, OthersHaveTheirOperationsInOrder)
{
    EXPECT_EQ(slotOf(&vclink::WorkingCopyGenerator::generate), 2u);
    EXPECT_EQ(slotOf(&vclink::ApplicationInteractor::getTerminator), 2u);
    EXPECT_EQ(slotOf(&vclink::ApplicationInteractor::getProgressReporter), 3u);
    EXPECT_EQ(slotOf(&vclink::ProgressReporter::setProgress), 2u);
    EXPECT_EQ(slotOf(&vclink::ProgressReporter::setProgressMessage), 3u);
}

TEST(Interfaces, MessageExceptionHasItsOperationsInOrder)
{
    using foundation::core::except::IMsgIDException;
    using FromWide = ustring (IMsgIDException::*)(const ustring &) const;
    using FromNarrow = ustring (IMsgIDException::*)(const std::string &) const;
    EXPECT_EQ(slotOf(&IMsgIDException::clone), 0u);
    EXPECT_EQ(slotOf(&IMsgIDException::rethrow), 1u);
    // 2 and 3 are the destructor.
    EXPECT_EQ(slotOf(&IMsgIDException::what), 4u);
    EXPECT_EQ(slotOf(static_cast<FromWide>(&IMsgIDException::convert_str)), 5u);
    EXPECT_EQ(slotOf(static_cast<FromNarrow>(&IMsgIDException::convert_str)), 6u);
    EXPECT_EQ(slotOf(&IMsgIDException::ToUstringImpl), 7u);
    EXPECT_EQ(slotOf(&IMsgIDException::GetID), 8u);
    EXPECT_EQ(slotOf(&IMsgIDException::GetUnicodeMessageTxt), 9u);
    EXPECT_EQ(slotOf(&IMsgIDException::GetBaseMsgIDObj), 10u);
}
