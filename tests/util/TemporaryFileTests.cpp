// SPDX-License-Identifier: MIT
#include <csignal>
#include <cstdlib>
#include <filesystem>
#include <set>
#include <stdexcept>
#include <string>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/resource.h>
#include <sys/stat.h>

#include "error/errorUtil/GitResult.hpp"
#include "support/Failure.hpp"
#include "support/GitFixture.hpp"
#include "support/LibGit2Session.hpp"
#include "support/LogCapture.hpp"
#include "support/NothingLeft.hpp"
#include "support/SignalAction.hpp"
#include "support/readFile.hpp"
#include "support/text.hpp"
#include "util/temporaryFile.hpp"

namespace
{

namespace fs = std::filesystem;
namespace git = vclink::git;
using testing::IsEmpty;
using testing::StartsWith;
using namespace vclink::test;

class TemporaryFile : public GitFixture
{
  protected:
    static std::string write(const std::string &bytes)
    {
        return asBytes(git::writeTemporaryFile(bytes.data(), bytes.size()));
    }
};

TEST_F(TemporaryFile, HoldsTheBytesInTheTemporaryFolderUnderANewNameForItsOwnerAlone)
{
    std::set<std::string> names;
    for (const std::string &bytes : {std::string(), std::string("text\r\n"),
                                     std::string("\0\377\n", 3), std::string(1'000'000, 'x')})
    {
        const fs::path file = write(bytes);
        EXPECT_EQ(readFile(file), bytes);
        EXPECT_EQ(file.parent_path(), environment().temporary());
        EXPECT_EQ(file.extension(), "");
        EXPECT_EQ(fs::status(file).permissions(), fs::perms(0600));
        EXPECT_TRUE(names.insert(file).second);
    }
}

TEST_F(TemporaryFile, HasANameEvenWhenItCannotBeWritten)
{
    ::setenv("TMPDIR", "/proc", 1);
    const std::string file = write("bytes");
    EXPECT_THAT(file, StartsWith("/proc/"));
    EXPECT_FALSE(fs::exists(file));
}

TEST_F(TemporaryFile, KeepsQuietAboutBytesThatDoNotFit)
{
    const SignalAction ignored(SIGXFSZ, SIG_IGN);
    rlimit before{};
    ASSERT_EQ(::getrlimit(RLIMIT_FSIZE, &before), 0);
    rlimit small = before;
    small.rlim_cur = 1000;
    ASSERT_EQ(::setrlimit(RLIMIT_FSIZE, &small), 0);
    const std::string file = write(std::string(100'000, 'x'));
    ::setrlimit(RLIMIT_FSIZE, &before);
    EXPECT_LE(fs::file_size(file), 1000U);
}

TEST_F(TemporaryFile, HoldsABlobAndIsNotMadeForOneThatIsMissing)
{
    const LibGit2Session session(environment());
    auto repository = makeRepository();
    repository.write("file", std::string("a\r\n\0b", 5));
    repository.commitAll("commit");
    const auto opened =
        git::acquire<git_repository>(git_repository_open, repository.path().c_str()).value();
    git_index_entry entry = {};
    git_oid_fromstr(&entry.id, repository.line({"rev-parse", "HEAD:file"}).c_str());
    const upath file = git::writeBlobToTemporaryFile(entry, opened.get());
    EXPECT_EQ(readFile(asBytes(file)), std::string("a\r\n\0b", 5));
    git::removeTemporaryFile(file);
    const NothingLeft check(environment().temporary());
    git_oid_fromstr(&entry.id, std::string(40, '1').c_str());
    EXPECT_EQ(
        failureOf([&] { static_cast<void>(git::writeBlobToTemporaryFile(entry, opened.get())); })
            .code,
        GIT_ENOTFOUND);
}

TEST_F(TemporaryFile, IsRemovedOrMayBeGoneAlreadyWithoutAWord)
{
    const LogCapture log;
    const std::string file = write("bytes");
    git::removeTemporaryFile(asPath(file));
    EXPECT_FALSE(fs::exists(file));
    git::removeTemporaryFile(asPath(file));
    EXPECT_THAT(log.messages(), IsEmpty());
}

TEST_F(TemporaryFile, ThatCannotBeRemovedIsToldOfAndLeft)
{
    const std::string file = folder() / "full";
    fs::create_directories(file + "/sub");
    LogCapture log;
    git::removeTemporaryFile(asPath(file));
    ASSERT_EQ(log.records().size(), 2U);
    EXPECT_EQ(log.records()[0].severity, 0x10U);
    EXPECT_THAT(log.records()[0].message, StartsWith("Exception caught: "));
    EXPECT_THAT(log.records()[0].message, testing::HasSubstr("filesystem_error"));
    EXPECT_EQ(log.records()[1].severity, 0x200U);
    EXPECT_EQ(log.records()[1].message, "Could not remove temporary file: " + file);
    EXPECT_TRUE(fs::exists(file));
    // Without an exception even if the log throws one.
    log.clear();
    log.onRecord([](const LogRecord &) { throw std::runtime_error("sink"); });
    git::removeTemporaryFile(asPath(file));
    EXPECT_EQ(log.records().size(), 1U);
}

} // namespace
