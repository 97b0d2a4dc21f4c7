// SPDX-License-Identifier: MIT
// The layout of the exported classes that hold data, which hosts that were built apart count on.
// Slots and layouts of the others are tested with the classes themselves.
#include <cstddef>
#include <functional>
#include <memory>
#include <string>
#include <type_traits>
#include <variant>

#include <gtest/gtest.h>

#include "error/VirtualTable.hpp"
#include "vclink/CMAdapterFactory.hpp"
#include "vclink/WorkingCopyGenerator.hpp"
#include "vclink/git/BranchParameters.hpp"
#include "vclink/git/BranchPointer.hpp"
#include "vclink/git/GitAdapterFactory.hpp"
#include "vclink/git/GitAttribute.hpp"
#include "vclink/git/GitConfig.hpp"
#include "vclink/git/GitRemote.hpp"
#include "vclink/git/GitRemoteHead.hpp"
#include "vclink/git/GitWorkingCopyGenerator.hpp"
#include "vclink/git/LibGit2Guard.hpp"
#include "vclink/git/LibGit2Version.hpp"

namespace vclink::git
{
namespace
{

using test::offsetIn;
using test::slotOf;

/// An owning pointer to a class that the header does not know.
using IncompletePointer = std::unique_ptr<int, std::function<void(int *)>>;

/// Two sizes do not add up if the larger alignment leaves a gap, as with libc++.
struct WithIncompletePointer
{
    virtual ~WithIncompletePointer() = default;
    IncompletePointer pointer;
};

static_assert(std::is_base_of_v<CMAdapterFactory, GitAdapterFactory> &&
                  sizeof(GitAdapterFactory) == sizeof(void *),
              "the factory has no data");
static_assert(std::is_base_of_v<WorkingCopyGenerator, GitWorkingCopyGenerator> &&
                  sizeof(GitWorkingCopyGenerator) == sizeof(WithIncompletePointer),
              "the generator has one member, the pointer to its private side");
static_assert(!std::is_polymorphic_v<GitConfig> && sizeof(GitConfig) == sizeof(IncompletePointer),
              "the configuration has one member, the pointer to its private side");
static_assert(!std::is_polymorphic_v<LibGit2Guard> && sizeof(LibGit2Guard) == sizeof(void *),
              "the guard has one member, the registration of the merge driver");
static_assert(std::is_standard_layout_v<LibGit2Version> &&
                  sizeof(LibGit2Version) == 3 * sizeof(int),
              "the version has three numbers");
static_assert(!std::is_polymorphic_v<BranchPointer> && sizeof(BranchPointer) == sizeof(std::string),
              "the branch pointer has a name");
static_assert(!std::is_polymorphic_v<BranchParameters> &&
                  sizeof(BranchParameters) == 2 * sizeof(std::string),
              "the branch parameters have a name and a start point");
static_assert(std::is_same_v<decltype(GitAttribute::attributeValue),
                             std::variant<GitAttribute::Set, GitAttribute::Unset,
                                          GitAttribute::Value, GitAttribute::Unspecified>>,
              "the alternatives have this order");

TEST(ExportedLayout, OfAnAttributeHoldsNameThenValue)
{
    const GitAttribute attribute;
    EXPECT_EQ(offsetIn(attribute, attribute.name), 0);
    EXPECT_EQ(offsetIn(attribute, attribute.attributeValue),
              static_cast<std::ptrdiff_t>(sizeof(ustring)));
}

TEST(ExportedLayout, OfARemoteHeadHoldsFlagIdsAndNamesInThisOrder)
{
    const GitRemoteHead head{};
    static_assert(sizeof(head.local) == 4 && sizeof(head.oid) == 20 && sizeof(head.loid) == 20);
    EXPECT_EQ(offsetIn(head, head.local), 0);
    EXPECT_EQ(offsetIn(head, head.oid), 4);
    EXPECT_EQ(offsetIn(head, head.loid), 24);
    EXPECT_EQ(offsetIn(head, head.name), 48);
    EXPECT_EQ(offsetIn(head, head.symrefTarget),
              static_cast<std::ptrdiff_t>(48 + sizeof(std::string)));
}

TEST(ExportedLayout, OfTheSlotsOfARemoteIsItsOrderOfOperations)
{
    EXPECT_EQ(slotOf(&GitRemote::fetch), 2u);
    EXPECT_EQ(slotOf(&GitRemote::push), 3u);
    EXPECT_EQ(slotOf(&GitRemote::getRemoteHeads), 4u);
}

} // namespace
} // namespace vclink::git
