// SPDX-License-Identifier: MIT
#include <memory>
#include <utility>

#include <boost/exception/exception.hpp>
#include <boost/variant/get.hpp>
#include <gtest/gtest.h>

#include "resource_core/BaseMsgID.hpp"
#include "resource_core/GenericMsgIDHolder.hpp"

using resource_core::BaseMsgID;
using resource_core::GenericMsgIDHolder;

namespace
{

BaseMsgID makeMessage()
{
    return BaseMsgID({7L, std::string("narrow"), ustring(u"wide")}, "catalogue", "Key");
}

} // namespace

TEST(MessageId, HoldsArgumentsCatalogueAndKey)
{
    const BaseMsgID message = makeMessage();
    EXPECT_EQ(message.getCatalogue(), "catalogue");
    EXPECT_EQ(message.getKey(), "Key");
    ASSERT_EQ(message.getArguments().size(), 3U);
    EXPECT_EQ(boost::get<long>(message.getArguments()[0]), 7);
    EXPECT_EQ(boost::get<std::string>(message.getArguments()[1]), "narrow");
    EXPECT_EQ(boost::get<ustring>(message.getArguments()[2]), u"wide");
}

TEST(MessageIdHolder, HoldsACopy)
{
    const BaseMsgID message = makeMessage();
    const GenericMsgIDHolder holder(message);
    EXPECT_NE(&holder.get(), &message);
    EXPECT_EQ(holder.get().getKey(), "Key");
    EXPECT_TRUE(holder.get().getArguments() == message.getArguments());
}

TEST(MessageIdHolder, CopiesWhatItHolds)
{
    const GenericMsgIDHolder holder(makeMessage());
    const auto copy = std::make_unique<GenericMsgIDHolder>(holder);
    EXPECT_NE(&copy->get(), &holder.get());
    EXPECT_TRUE(copy->get().getArguments() == holder.get().getArguments());
    GenericMsgIDHolder assigned;
    assigned = holder;
    EXPECT_NE(&assigned.get(), &holder.get());
    EXPECT_EQ(assigned.get().getKey(), "Key");
    const GenericMsgIDHolder &itself = assigned;
    assigned = itself;
    EXPECT_EQ(assigned.get().getKey(), "Key");
}

TEST(MessageIdHolder, IsEmptyAfterItWasMovedFrom)
{
    GenericMsgIDHolder holder(makeMessage());
    GenericMsgIDHolder moved(std::move(holder));
    EXPECT_EQ(moved.get().getKey(), "Key");
    GenericMsgIDHolder assigned;
    assigned = std::move(moved);
    EXPECT_EQ(assigned.get().getKey(), "Key");
}

TEST(MessageIdHolder, RaisesWhenItIsReadWhileEmpty)
{
    const GenericMsgIDHolder empty;
    const auto copy = std::make_unique<GenericMsgIDHolder>(empty);
    try
    {
        copy->get();
        FAIL() << "nothing was raised";
    }
    catch (const GenericMsgIDHolder::EmptyGenericMsgIDHolder &error)
    {
        EXPECT_STREQ(error.what(), "GenericMsgIDHolder object is empty!\n");
        EXPECT_NE(dynamic_cast<const boost::exception_detail::clone_base *>(&error), nullptr);
    }
}
