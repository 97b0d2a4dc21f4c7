// SPDX-License-Identifier: MIT
#include <csignal>
#include <string>

#include <gtest/gtest.h>
#include <sys/resource.h>

#include "DiskFixture.hpp"

namespace
{

using vclink::test::Action;

/// Limits the size of files as long as it lives. The signal that comes with the refusal is ignored,
/// as it is by hosts that want to be told instead.
class FileSizeLimit
{
  public:
    explicit FileSizeLimit(rlim_t bytes) : handler_(std::signal(SIGXFSZ, SIG_IGN))
    {
        ::getrlimit(RLIMIT_FSIZE, &saved_);
        const rlimit limit{bytes, saved_.rlim_max};
        ::setrlimit(RLIMIT_FSIZE, &limit);
    }
    FileSizeLimit(const FileSizeLimit &) = delete;
    FileSizeLimit &operator=(const FileSizeLimit &) = delete;
    ~FileSizeLimit()
    {
        ::setrlimit(RLIMIT_FSIZE, &saved_);
        std::signal(SIGXFSZ, handler_);
    }

  private:
    void (*handler_)(int);
    rlimit saved_{};
};

class FileSizeLimited : public vclink::test::DiskFixture
{
};

TEST_P(FileSizeLimited, FailsWithATypeAndLosesNothing)
{
    prepare(folder() / "trial");
    // Nothing; what a reference takes; what a small object takes; more than an index does.
    for (const rlim_t bytes : {0U, 41U, 120U, 500U})
    {
        SCOPED_TRACE(std::to_string(bytes) + " bytes");
        tryOnce(
            [bytes](const Action &action)
            {
                const FileSizeLimit limit(bytes);
                return vclink::test::outcomeOf(action);
            });
    }
}

INSTANTIATE_TEST_SUITE_P(Of, FileSizeLimited,
                         testing::ValuesIn(vclink::test::operationsThatWrite()),
                         vclink::test::nameOfOperation);

} // namespace
