// SPDX-License-Identifier: MIT
#include <gmock/gmock.h>

#include "ShellFixture.hpp"

namespace vclink::test
{
namespace
{

using testing::ContainsRegex;
using testing::HasSubstr;
using testing::Not;

class ShellLog : public ShellFixture
{
  protected:
    /// The text on standard error after a failure with these severities shown.
    std::string logOfFailure(const std::string &severities) const
    {
        const CommandResult result = shell({"-C", "broken", "--log", severities, "status"}).run();
        EXPECT_EQ(result.exitStatus, 1);
        EXPECT_EQ(result.output, "");
        return result.errors;
    }
};

TEST_F(ShellLog, IsSilentUnlessAskedFor)
{
    makeBrokenRepository();
    EXPECT_THAT(shell({"-C", "broken", "status"}).run().errors, Not(HasSubstr("[")));
}

TEST_F(ShellLog, ShowsEachRecordOnALineWithItsSeverity)
{
    makeBrokenRepository();
    const std::string log = logOfFailure("diagnostic,scope-entry,scope-exit");
    EXPECT_THAT(log, ContainsRegex("\\[scope-entry\\] .*throwIfError.*\n"
                                   "\\[diagnostic\\] Throwing error .*missing.*\n"
                                   "\\[scope-exit\\] .*throwIfError.* \\[throw\\]\n"
                                   "(\\[diagnostic\\] Unregister merge driver: .*\n)*"
                                   "vclink-shell: "));
}

TEST_F(ShellLog, ShowsOnlyTheSeveritiesThatAreNamed)
{
    makeBrokenRepository();
    EXPECT_THAT(logOfFailure("diagnostic"), HasSubstr("[diagnostic] "));
    EXPECT_THAT(logOfFailure("diagnostic"), Not(HasSubstr("[scope-")));
    EXPECT_THAT(logOfFailure("scope-entry"), HasSubstr("[scope-entry] "));
    EXPECT_THAT(logOfFailure("scope-entry"), Not(HasSubstr("[scope-exit] ")));
    EXPECT_THAT(logOfFailure("scope-entry"), Not(HasSubstr("[diagnostic] ")));
    EXPECT_THAT(logOfFailure("parameter,progress,exception"), Not(HasSubstr("[diagnostic]")));
    EXPECT_THAT(logOfFailure("0"), Not(HasSubstr("[diagnostic]")));
}

TEST_F(ShellLog, TakesAMaskInDecimalOrHexadecimal)
{
    makeBrokenRepository();
    const std::string named = logOfFailure("diagnostic,scope-entry");
    EXPECT_EQ(logOfFailure("40"), named);
    EXPECT_EQ(logOfFailure("0x28"), named);
    EXPECT_EQ(logOfFailure("0X28"), named);
    EXPECT_EQ(logOfFailure("all"), logOfFailure("0x27e"));
}

TEST_F(ShellLog, StaysOutOfStandardOutput)
{
    const GitRepository repository = makeRepository();
    repository.write("file", "");
    const CommandResult result = runIn(repository.path(), {"--log", "all", "status"});
    EXPECT_EQ(result.exitStatus, 0);
    EXPECT_EQ(result.output, "unversioned\tfile\n");
    EXPECT_THAT(result.errors, HasSubstr("[scope-entry] "));
}

} // namespace
} // namespace vclink::test
