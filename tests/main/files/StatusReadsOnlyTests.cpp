// SPDX-License-Identifier: MIT
#include <chrono>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <map>
#include <string>

#include <gtest/gtest.h>

#include "main/AdapterFixture.hpp"
#include "support/text.hpp"

namespace
{

namespace fs = std::filesystem;
using vclink::test::asPath;

/// Every entry below a folder with its time and its bytes.
std::map<std::string, std::string> photograph(const fs::path &folder)
{
    std::map<std::string, std::string> entries;
    for (const auto &entry : fs::recursive_directory_iterator(folder))
    {
        const auto time = entry.is_symlink() ? fs::file_time_type() : entry.last_write_time();
        std::string &seen = entries[entry.path().string()];
        const std::chrono::nanoseconds sinceEpoch = time.time_since_epoch();
        seen = std::to_string(sinceEpoch.count()) + '\n';
        if (entry.is_regular_file())
        {
            std::ifstream stream(entry.path(), std::ios::binary);
            seen.append(std::istreambuf_iterator<char>(stream), {});
        }
    }
    return entries;
}

TEST(StatusReadsOnlyPhotograph, SeesAChangedByte)
{
    const vclink::test::TemporaryFolder folder;
    const vclink::test::GitRepository files(folder.path());
    files.write("a/b", "x");
    const auto before = photograph(folder.path());
    EXPECT_EQ(photograph(folder.path()), before);
    files.write("a/b", "y");
    EXPECT_NE(photograph(folder.path()), before);
}

class StatusReadsOnly : public vclink::test::AdapterFixture
{
  protected:
    StatusReadsOnly()
    {
        for (const auto *name : {"clean", "edited", "gone", "sub/staged", "touched"})
            repository_.write(name, name);
        repository_.commitAll("first");
        repository_.write("edited", "other");
        repository_.remove("gone");
        repository_.write("sub/staged", "other");
        repository_.add({"sub/staged"});
        repository_.write("new/file", "x");
        // What git itself would write into the index at once.
        fs::last_write_time(repository_ / "touched",
                            fs::file_time_type::clock::now() - std::chrono::hours(100));
    }

    void query(vclink::CMAdapter &adapter) const
    {
        adapter.getFolderStates(adapter.getRootFolder());
        adapter.getFolderStates(asPath(repository_ / "sub"));
        adapter.getFileStates({asPath(repository_ / "touched"), asPath(repository_ / "gone")});
    }

    vclink::test::GitRepository repository_ = makeRepository();
};

TEST_F(StatusReadsOnly, AndWritesNothingAndChangesNothingOfTheHost)
{
    const auto adapter = makeAdapter(repository_.path());
    const auto before = photograph(repository_.path());
    const fs::path current = fs::current_path();
    const auto home = photograph(environment().home());
    query(*adapter);
    EXPECT_EQ(photograph(repository_.path()), before);
    EXPECT_EQ(fs::current_path(), current);
    EXPECT_EQ(photograph(environment().home()), home);
    EXPECT_TRUE(fs::is_empty(environment().temporary()));
    EXPECT_EQ(repository_.git({"status", "--porcelain", "--untracked-files=all"}),
              " M edited\n D gone\nM  sub/staged\n?? new/file\n");
}

} // namespace
