// SPDX-License-Identifier: MIT
#include <stdexcept>
#include <string>

#include <gtest/gtest.h>

#include "scl/core/memory/make_unique_incomplete.hpp"

using scl::core::memory::make_unique_incomplete;
using scl::core::memory::unique_incomplete_ptr;

namespace
{

struct Incomplete;

/// Has no need of the definition below.
struct Holder
{
    unique_incomplete_ptr<Incomplete> impl;
};

Holder makeHolder(const std::string &text, int &alive);
const std::string &readText(const Holder &holder);

TEST(MakeUniqueIncomplete, OwnsAnObjectOfAnIncompleteType)
{
    int alive = 0;
    {
        const Holder holder = makeHolder("text", alive);
        EXPECT_EQ(alive, 1);
        EXPECT_EQ(readText(holder), "text");
    }
    EXPECT_EQ(alive, 0);
}

struct Incomplete
{
    Incomplete(std::string given, int &count) : text(std::move(given)), alive(count)
    {
        ++alive;
    }
    Incomplete(const Incomplete &) = delete;
    Incomplete &operator=(const Incomplete &) = delete;
    ~Incomplete()
    {
        --alive;
    }

    std::string text;
    int &alive;
};

Holder makeHolder(const std::string &text, int &alive)
{
    return {make_unique_incomplete<Incomplete, Incomplete>(text, alive)};
}

const std::string &readText(const Holder &holder)
{
    return holder.impl->text;
}

struct Base
{
    int number = 1;
};

struct Actual : Base
{
    explicit Actual(bool &isGone) : isGone_(isGone)
    {
    }
    Actual(const Actual &) = delete;
    Actual &operator=(const Actual &) = delete;
    ~Actual()
    {
        isGone_ = true;
    }

  private:
    bool &isGone_;
};

struct Refusing
{
    Refusing()
    {
        throw std::runtime_error("refused");
    }
};

} // namespace

TEST(MakeUniqueIncomplete, DeletesTheActualObjectThroughAPlainBase)
{
    bool isGone = false;
    {
        const unique_incomplete_ptr<Base> owner = make_unique_incomplete<Base, Actual>(isGone);
        EXPECT_EQ(owner->number, 1);
        EXPECT_FALSE(isGone);
    }
    EXPECT_TRUE(isGone);
}

TEST(MakeUniqueIncomplete, PassesOnWhatTheConstructorRaises)
{
    EXPECT_THROW((make_unique_incomplete<Refusing, Refusing>()), std::runtime_error);
}
