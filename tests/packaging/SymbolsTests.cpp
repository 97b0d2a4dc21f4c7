// SPDX-License-Identifier: MIT
// The names that the library shows.
#include <regex>
#include <set>
#include <sstream>
#include <string>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "InstalledFixture.hpp"

namespace
{

using namespace vclink::test;
using testing::HasSubstr;
using testing::IsSupersetOf;

TEST(Symbols, AreTheOnesThatAreListed)
{
    const auto report =
        Command({VCLINK_SOURCE_FOLDER "/scripts/abi", "--symbols", VCLINK_LIBRARY}).run();
    EXPECT_EQ(report.exitStatus, 0) << report.output << report.errors;
}

/// One header a class: what has none is not meant for a host.
TEST(Symbols, AreOfTheClassesThatHaveAHeader)
{
    std::set<std::string> known{"operator", "serialize"};
    for (const auto &name : filesBelow(VCLINK_SOURCE_FOLDER "/include/vclink/git"))
        known.insert(name.substr(0, name.find('.')));
    std::istringstream symbols(
        runToSuccess(Command({"nm", "--dynamic", "--defined-only", "--demangle", VCLINK_LIBRARY})));
    const std::regex ownName("^[0-9a-f]+ . (?:[a-z -]+ (?:for|to) )?vclink::git::([A-Za-z0-9]+)");
    std::set<std::string> seen;
    for (std::string line; std::getline(symbols, line);)
    {
        std::smatch match;
        if (std::regex_search(line, match, ownName))
            EXPECT_EQ(known.count(*seen.insert(match[1]).first), 1u) << line;
        else
            EXPECT_THAT(line, HasSubstr("shared_vclink::git::"));
    }
    EXPECT_THAT(seen, IsSupersetOf({"BranchManager", "GitAdapterFactory", "LibGit2Exception"}));
}

} // namespace
