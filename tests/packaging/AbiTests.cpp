// SPDX-License-Identifier: MIT
// The report on the binary interface: that the library's is the one of the baseline, and that the
// report finds what breaks a host that is built already.
#include <filesystem>
#include <fstream>
#include <string>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "InstalledFixture.hpp"

namespace
{

using namespace vclink::test;
using testing::AllOf;
using testing::HasSubstr;

const std::string script = VCLINK_SOURCE_FOLDER "/scripts/abi";

#ifdef VCLINK_WHOLE_DEBUG_INFORMATION
TEST(Interface, IsThatOfTheBaseline)
{
    const auto report = Command({script, VCLINK_LIBRARY}).run();
    EXPECT_EQ(report.exitStatus, 0) << report.output << report.errors;
}
#endif

/// A library of one class, and what the report says of it after a change.
class AbiReport : public GitFixture
{
  protected:
    AbiReport()
    {
        std::filesystem::create_directory(folder() / "baseline");
        std::filesystem::create_directory(folder() / "include");
        build("first", "virtual void one() = 0; virtual void two() = 0;", "long value;");
        runToSuccess(command({"--renew"}));
    }

    /// Builds the library with a class of these members.
    /// @param plain the name of its one operation that is not virtual
    void build(const std::string &plain, const std::string &slots, const std::string &fields) const
    {
        std::ofstream(folder() / "include" / "Sample.hpp")
            << boost_ << "struct __attribute__((visibility(\"default\"))) Sample\n{\n"
            << slots << "\nvirtual ~Sample();\nint " << plain << "() const;\n"
            << fields << "\n};\n";
        std::ofstream(folder() / "Sample.cpp")
            << "#include \"include/Sample.hpp\"\nint Sample::" << plain << R"(() const { return 1; }
                Sample::~Sample() {}
                __attribute__((visibility("default"))) Sample *makeSample() { return nullptr; }
            )";
        runToSuccess(Command({VCLINK_COMPILER, "-g", "-fPIC", "-shared", "-fvisibility=hidden",
                              "-o", library(), "Sample.cpp"})
                         .in(folder().path()));
    }

    /// Puts a class of Boost before the library's, with a detail that has these members.
    void useBoost(const std::string &fields)
    {
        boost_ = "namespace boost { namespace sample_detail { struct Storage { " + fields +
                 " }; }\nclass holder { sample_detail::Storage storage_; }; }\n";
    }

    Command command(std::vector<std::string> options) const
    {
        options.insert(options.begin(), script);
        options.insert(options.end(), {"--baseline", (folder() / "baseline").string(), "--headers",
                                       (folder() / "include").string(), library()});
        return Command(options);
    }

    CommandResult report() const
    {
        return command({}).run();
    }

  private:
    std::string library() const
    {
        return (folder() / "libsample.so").string();
    }

    std::string boost_;
};

TEST_F(AbiReport, HasNothingToSayOfTheSameLibrary)
{
    const auto same = report();
    EXPECT_EQ(same.exitStatus, 0) << same.output << same.errors;
    EXPECT_EQ(same.output, "");
}

TEST_F(AbiReport, FindsAChangedOrderOfSlots)
{
    build("first", "virtual void two() = 0; virtual void one() = 0;", "long value;");
    const auto changed = report();
    EXPECT_EQ(changed.exitStatus, 1);
    EXPECT_THAT(changed.output, AllOf(HasSubstr("Sample::one()"), HasSubstr("vtable")));
}

TEST_F(AbiReport, FindsAnAddedMember)
{
    build("first", "virtual void one() = 0; virtual void two() = 0;", "long value; long more;");
    const auto changed = report();
    EXPECT_EQ(changed.exitStatus, 1);
    EXPECT_THAT(changed.output, HasSubstr("'long int more'"));
}

TEST_F(AbiReport, IgnoresAnotherDetailOfBoost)
{
    const auto *slots = "virtual void one() = 0; virtual void two() = 0;";
    useBoost("char data[8];");
    build("first", slots, "boost::holder value;");
    runToSuccess(command({"--renew"}));
    useBoost("unsigned char bytes[8];");
    build("first", slots, "boost::holder value;");
    const auto same = report();
    EXPECT_EQ(same.exitStatus, 0) << same.output << same.errors;
}

TEST_F(AbiReport, FindsAnotherSizeOfADetailOfBoost)
{
    const auto *slots = "virtual void one() = 0; virtual void two() = 0;";
    useBoost("char data[8];");
    build("first", slots, "boost::holder value;");
    runToSuccess(command({"--renew"}));
    useBoost("char data[16];");
    build("first", slots, "boost::holder value;");
    const auto changed = report();
    EXPECT_EQ(changed.exitStatus, 1);
    EXPECT_THAT(changed.output, HasSubstr("type size changed from 128 to 192"));
}

TEST_F(AbiReport, FindsALostAndANewSymbol)
{
    build("second", "virtual void one() = 0; virtual void two() = 0;", "long value;");
    const auto changed = report();
    EXPECT_EQ(changed.exitStatus, 1);
    EXPECT_THAT(changed.output, AllOf(HasSubstr("-Sample::first() const\n"),
                                      HasSubstr("+Sample::second() const\n")));
}

} // namespace
