// SPDX-License-Identifier: MIT
// Tells which places of the library each test reaches, to the file that VCLINK_REACH names: a line
// "places" with the addresses of all places, relative to the program; then for each test a line
// with its name, its milliseconds and the numbers of the places that it reached. Built with
// VCLINK_RECORD_REACH only.
#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <fstream>

#include <dlfcn.h>
#include <gtest/gtest.h>
#include <sys/mman.h>
#include <sys/syscall.h>
#include <unistd.h>

namespace
{

/// The compiler's record of a place: its address, and whether a function begins there.
struct Place
{
    std::uintptr_t address;
    std::uintptr_t flags;
};

struct Reach
{
    char *countersBegin = nullptr;
    char *countersEnd = nullptr;
    const Place *placesBegin = nullptr;
    const Place *placesEnd = nullptr;
    /// What child processes reached, in memory that they share.
    char *ofChildren = nullptr;

    std::size_t size() const
    {
        return static_cast<std::size_t>(countersEnd - countersBegin);
    }
};

/// Constant-initialised: the compiler's calls come before any constructor.
Reach reach;

char *makeShared(std::size_t size)
{
    void *const memory =
        ::mmap(nullptr, size, PROT_READ | PROT_WRITE, MAP_SHARED | MAP_ANONYMOUS, -1, 0);
    if (memory == MAP_FAILED)
        std::abort();
    return static_cast<char *>(memory);
}

std::uintptr_t baseOf(std::uintptr_t address)
{
    Dl_info info{};
    if (::dladdr(reinterpret_cast<const void *>(address), &info) == 0)
        std::abort();
    return reinterpret_cast<std::uintptr_t>(info.dli_fbase);
}

class ReachRecorder : public testing::EmptyTestEventListener
{
  public:
    explicit ReachRecorder(const char *file) : file_(file, std::ios::app)
    {
    }

  private:
    void OnTestProgramStart(const testing::UnitTest & /*program*/) override
    {
        file_ << "places";
        if (reach.placesBegin != nullptr)
        {
            const std::uintptr_t base = baseOf(reach.placesBegin->address);
            for (const Place *place = reach.placesBegin; place != reach.placesEnd; ++place)
                file_ << ' ' << place->address - base;
            reach.ofChildren = makeShared(reach.size());
        }
        file_ << std::endl;
    }

    void OnTestStart(const testing::TestInfo & /*test*/) override
    {
        for (std::size_t number = 0; number < reach.size(); ++number)
            reach.countersBegin[number] = reach.ofChildren[number] = 0;
    }

    void OnTestEnd(const testing::TestInfo &test) override
    {
        file_ << test.test_suite_name() << '.' << test.name() << ' '
              << test.result()->elapsed_time();
        for (std::size_t number = 0; number < reach.size(); ++number)
        {
            if (reach.countersBegin[number] != 0 || reach.ofChildren[number] != 0)
                file_ << ' ' << number;
        }
        file_ << std::endl;
    }

    std::ofstream file_;
};

const bool isListening = []
{
    const char *const file = std::getenv("VCLINK_REACH");
    if (file != nullptr)
        testing::UnitTest::GetInstance()->listeners().Append(new ReachRecorder(file));
    return file != nullptr;
}();

} // namespace

extern "C"
{
    /// In place of the C library's: children that a test forks end by it.
    void _exit(int status)
    {
        for (std::size_t number = 0; reach.ofChildren != nullptr && number < reach.size(); ++number)
        {
            if (reach.countersBegin[number] != 0)
                reach.ofChildren[number] = 1;
        }
        for (;;)
            ::syscall(SYS_exit_group, status);
    }

    // The names are the compiler's. All objects of the program share one table of each kind.
    // NOLINTBEGIN(bugprone-reserved-identifier,readability-identifier-naming)
    void __sanitizer_cov_8bit_counters_init(char *begin, char *end);
    void __sanitizer_cov_pcs_init(const std::uintptr_t *begin, const std::uintptr_t *end);

    void __sanitizer_cov_8bit_counters_init(char *begin, char *end)
    {
        reach.countersBegin = begin;
        reach.countersEnd = end;
    }

    void __sanitizer_cov_pcs_init(const std::uintptr_t *begin, const std::uintptr_t *end)
    {
        reach.placesBegin = reinterpret_cast<const Place *>(begin);
        reach.placesEnd = reinterpret_cast<const Place *>(end);
    }
    // NOLINTEND(bugprone-reserved-identifier,readability-identifier-naming)
}
