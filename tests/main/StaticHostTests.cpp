// SPDX-License-Identifier: MIT
#include <filesystem>
#include <string>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "support/Command.hpp"
#include "support/GitFixture.hpp"

namespace
{

using testing::HasSubstr;
using namespace vclink::test;

/// A host whose objects are static, run in a working copy.
class StaticHost : public GitFixture
{
  protected:
    static constexpr const char *recordOfAnEnd = "Unregister merge driver: *";

    Command host(std::vector<std::string> arguments) const
    {
        arguments.insert(arguments.begin(), VCLINK_STATIC_HOST);
        // libgit2's own leaks are suppressed, and LeakSanitizer would count them.
        return Command(std::move(arguments))
            .in(repository_.path())
            .environment("LSAN_OPTIONS", "print_suppressions=0");
    }
    /// How many guards have told of their end.
    static int countEnds(const std::string &output)
    {
        int count = 0;
        for (auto at = output.find(recordOfAnEnd); at != std::string::npos;
             at = output.find(recordOfAnEnd, at + 1))
            ++count;
        return count;
    }
    /// The guard, and those of the configuration, the adapter and the generator.
    static void expectCleanEnd(const CommandResult &result)
    {
        EXPECT_EQ(result.exitStatus, 0) << result.errors;
        EXPECT_EQ(result.signal, 0);
        EXPECT_EQ(result.errors, "");
        EXPECT_EQ(countEnds(result.output), 4) << result.output;
    }

    GitRepository repository_ = makeRepository();
};

TEST_F(StaticHost, EndsCleanlyWithWhatItNeverUsed)
{
    expectCleanEnd(host({}).run());
}

TEST_F(StaticHost, EndsCleanlyWithWhatItUsed)
{
    repository_.commit("first");
    repository_.write("a", "x");
    const CommandResult result = host({"use", repository_.path().string()}).run();
    expectCleanEnd(result);
    EXPECT_THAT(result.output, HasSubstr("\n1 files\n"));
    EXPECT_TRUE(std::filesystem::exists(repository_ / "clone/.git"));
}

TEST_F(StaticHost, EndsCleanlyWhereTheLogIsEnabledBeforeItsObjectsBegin)
{
    expectCleanEnd(host({}).environment("VCLINK_TEST_LOG_EARLY", "1").run());
}

} // namespace
