// SPDX-License-Identifier: MIT
// How the shared libraries and the program are linked.
#include <map>
#include <ostream>
#include <regex>
#include <set>
#include <sstream>
#include <string>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "InstalledFixture.hpp"
#include "support/Command.hpp"
#include "support/boostRelease.hpp"
#include "support/strings.hpp"

namespace
{

using namespace vclink::test;
using testing::ContainsRegex;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::Not;

/// What the expression's first group matches, line by line.
std::set<std::string> findAll(const std::string &text, const std::string &expression)
{
    const std::regex wanted(expression);
    std::set<std::string> found;
    for (const auto &line : split(text))
    {
        std::smatch match;
        if (std::regex_search(line, match, wanted))
            found.insert(match[1]);
    }
    return found;
}

struct Binary
{
    const char *name;
    const char *file;
};

void PrintTo(const Binary &binary, std::ostream *stream)
{
    *stream << binary.name;
}

class Linking : public testing::TestWithParam<Binary>
{
  protected:
    std::string readelf(const std::string &option) const
    {
        return runToSuccess(Command({"readelf", "--wide", option, GetParam().file}));
    }
};

TEST_P(Linking, ResolvesAllSymbolsAtTheStartAndProtectsThem)
{
    const std::string dynamic = readelf("--dynamic");
    EXPECT_THAT(dynamic, ContainsRegex("FLAGS_1.* NOW"));
    EXPECT_THAT(readelf("--segments"), HasSubstr("GNU_RELRO"));
}

TEST_P(Linking, RelocatesNoCode)
{
    EXPECT_THAT(readelf("--dynamic"), Not(HasSubstr("TEXTREL")));
}

TEST_P(Linking, HasNoMemoryToWriteAndExecute)
{
    const std::string segments = readelf("--segments");
    EXPECT_THAT(segments, ContainsRegex("GNU_STACK .* RW  "));
    EXPECT_THAT(findAll(segments, "^ *(LOAD .* RWE )"), IsEmpty());
}

TEST_P(Linking, GuardsTheStack)
{
    EXPECT_THAT(readelf("--dyn-syms"), HasSubstr(" UND __stack_chk_fail@"));
}

TEST_P(Linking, IsWithWhatIsUsedOnly)
{
    // ldd fails when it finds something.
    const auto unused = Command({"ldd", "--unused", GetParam().file}).run();
    EXPECT_TRUE(unused.succeeded()) << unused.output << unused.errors;
}

INSTANTIATE_TEST_SUITE_P(Of, Linking,
                         testing::Values(Binary{"library", VCLINK_LIBRARY},
                                         Binary{"host", VCLINK_HOST_LIBRARY},
                                         Binary{"shell", VCLINK_SHELL}),
                         [](const auto &parameter) { return parameter.param.name; });

TEST(LibraryLinking, NeedsTheHostLibGit2AndTwoOfBoost)
{
    const auto dynamic = runToSuccess(Command({"readelf", "--wide", "--dynamic", VCLINK_LIBRARY}));
    // Without the versions, which are the system's affair, and the system's own libraries.
    auto needed = findAll(dynamic, R"(\(NEEDED\).*\[([^\]]*)\.so)");
    for (const auto *own : {"libstdc++", "libgcc_s", "libm", "libc", "ld-linux-x86-64"})
        needed.erase(own);
    EXPECT_THAT(needed,
                ElementsAre("libboost_filesystem", "libboost_thread", "libgit2", "libvclink_host"));
}

TEST(LibraryLinking, CarriesTheVersionInItsName)
{
    const auto dynamic = runToSuccess(Command({"readelf", "--wide", "--dynamic", VCLINK_LIBRARY}));
    EXPECT_THAT(findAll(dynamic, R"(\(SONAME\).*\[(.*)\])"),
                ElementsAre("libvclink_git.so." VCLINK_SO_VERSION));
}

#ifdef __x86_64__
/// The system's start files are not marked for the control of jumps, so that the linker leaves the
/// mark out; the instruction itself is what protects.
TEST(LibraryLinking, BeginsEachFunctionThatItShowsWithAMarkForJumps)
{
    // Address to name; of several names for one function one is enough.
    std::map<unsigned long, std::string> unmarked;
    std::istringstream names(
        runToSuccess(Command({"nm", "--dynamic", "--defined-only", VCLINK_LIBRARY})));
    std::string address;
    char kind = 0;
    for (std::string name; names >> address >> kind >> name;)
    {
        if (kind == 'T' || kind == 'W')
            unmarked.emplace(std::stoul(address, nullptr, 16), name);
    }
    ASSERT_GT(unmarked.size(), 50u);
    const auto code =
        runToSuccess(Command({"objdump", "--disassemble", "--no-show-raw-insn", VCLINK_LIBRARY}));
    for (const auto &at : findAll(code, "^ *([0-9a-f]+):\\s+endbr64"))
        unmarked.erase(std::stoul(at, nullptr, 16));
    EXPECT_THAT(unmarked, IsEmpty());
}
#endif

#ifdef VCLINK_OPTIMISED
TEST(LibraryLinking, ChecksTheBoundsOfTheCLibrary)
{
    const auto symbols = runToSuccess(Command({"readelf", "--wide", "--dyn-syms", VCLINK_LIBRARY}));
    EXPECT_THAT(symbols, HasSubstr(" UND __snprintf_chk@"));
    if (!boost_release::formatsIntoUnknownBuffers)
    {
        EXPECT_THAT(symbols, Not(HasSubstr(" UND snprintf@")));
    }
}
#endif

} // namespace
