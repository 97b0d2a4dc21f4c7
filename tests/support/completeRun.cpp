// SPDX-License-Identifier: MIT
// Linked into each test program. One that ends in the midst of its tests fails, whatever status it
// ends with: GoogleTest by itself does not notice a test that calls exit(). One that comes to its
// end adds the number of the cases that it ran to the file that VCLINK_CASES names.
#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <string>

#include <gtest/gtest.h>
#include <unistd.h>

namespace
{

/// Plain variables: they are read when the program ends.
pid_t program = 0;
bool isUnderWay = false;

void failInTheMidst()
{
    // Children that tests fork may end as they like.
    if (!isUnderWay || ::getpid() != program)
        return;
    std::fputs("[  FAILED  ] The program ends in the midst of its tests.\n", stderr);
    ::_exit(EXIT_FAILURE);
}

class CompleteRun : public testing::EmptyTestEventListener
{
  public:
    explicit CompleteRun(const char *file) : file_(file != nullptr ? file : "")
    {
    }

  private:
    void OnTestProgramStart(const testing::UnitTest & /*tests*/) override
    {
        // What runs inside a death test is meant to end.
        isUnderWay = ::testing::GTEST_FLAG(internal_run_death_test).empty();
        program = ::getpid();
    }
    void OnTestProgramEnd(const testing::UnitTest &tests) override
    {
        isUnderWay = false;
        if (!file_.empty())
            std::ofstream(file_, std::ios::app) << std::to_string(tests.test_to_run_count()) + '\n';
    }

    const std::string file_;
};

const bool isListening = []
{
    testing::UnitTest::GetInstance()->listeners().Append(
        new CompleteRun(std::getenv("VCLINK_CASES")));
    return std::atexit(failInTheMidst) == 0;
}();

} // namespace
