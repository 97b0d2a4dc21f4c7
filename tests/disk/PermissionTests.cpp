// SPDX-License-Identifier: MIT
#include <algorithm>
#include <string>
#include <utility>
#include <vector>

#include <gtest/gtest.h>
#include <sys/stat.h>

#include "DiskFixture.hpp"
#include "support/strings.hpp"

namespace
{

namespace fs = std::filesystem;
using vclink::test::Action;
using vclink::test::startsWith;

/// Takes permissions from a file, or from a folder and all folders in it, as long as it lives.
class Withheld
{
  public:
    Withheld(const fs::path &path, mode_t mode)
    {
        save(path);
        if (fs::is_directory(path))
        {
            for (const auto &entry : fs::recursive_directory_iterator(path))
            {
                if (!entry.is_symlink() && entry.is_directory())
                    save(entry.path());
            }
        }
        // A folder comes after those in it, which can't be reached any more then.
        std::for_each(saved_.rbegin(), saved_.rend(),
                      [mode](const auto &place) { ::chmod(place.first.c_str(), mode); });
    }
    Withheld(const Withheld &) = delete;
    Withheld &operator=(const Withheld &) = delete;
    ~Withheld()
    {
        for (const auto &[path, mode] : saved_)
        {
            if (fs::exists(path))
                ::chmod(path.c_str(), mode);
        }
    }

  private:
    void save(const fs::path &path)
    {
        struct stat status = {};
        ::stat(path.c_str(), &status);
        saved_.emplace_back(path, status.st_mode);
    }

    std::vector<std::pair<fs::path, mode_t>> saved_;
};

struct Lack
{
    fs::path path;
    mode_t mode;
};

std::string replaced(std::string text, const std::string &from, const std::string &to)
{
    for (auto at = text.find(from); at != std::string::npos; at = text.find(from, at + to.size()))
        text.replace(at, from.size(), to);
    return text;
}

class WithoutPermission : public vclink::test::DiskFixture
{
  protected:
    std::vector<Lack> lacks() const
    {
        const fs::path root = trial().repository().path();
        const std::string &name = GetParam().name;
        if (startsWith(name, "write"))
            return {{environment().home(), 0555}, {environment().home() / ".gitconfig", 0000}};
        std::vector<Lack> all{
            {root, 0555},
            {root / ".git/objects", 0555},
            {root / ".git/refs", 0555},
            {root / ".git/refs", 0000},
            {root / ".git/index", 0000},
            {root / ".git/HEAD", 0000},
            {root / ".git/config", 0000},
        };
        if (fs::is_regular_file(fs::symlink_status(root / "file")))
            all.push_back({root / "file", 0000});
        if (fs::exists(root.parent_path() / "origin"))
            all.push_back({root.parent_path() / "origin", 0555});
        if (name == "mergeByTool")
            all.push_back({environment().temporary(), 0555});
        return all;
    }

    /// What an operation may leave that ends as if all was well.
    std::vector<std::string> otherGists(const fs::path &path) const
    {
        // A status walk that fails finds no files.
        if (startsWith(GetParam().name, "addFiles"))
            return {gistBefore()};
        // As a configuration that is not there: the identity comes from the environment.
        if (path.filename() == "config")
            return {replaced(trial().normalGist(), "Test Person", "builder")};
        // libgit2 leaves a file alone that it can't read.
        if (GetParam().name == "revertFiles" && path.filename() == "file")
            return {statusOfFile() + trial().normalGist()};
        return {};
    }
    /// If HEAD cannot be read, a revert intentionally removes the files from the index, and then
    /// fails; the next one restores them.
    std::vector<std::string> losses(const Lack &lack) const
    {
        const bool isHeadless =
            lack.mode == 0000 && (lack.path.filename() == "HEAD" || lack.path.filename() == "refs");
        if (startsWith(GetParam().name, "revertFiles") && isHeadless)
            return {"entry file", "entry other"};
        return {};
    }
    std::string statusOfFile() const
    {
        const auto begin = gistBefore().find("1 .M ");
        return gistBefore().substr(begin, gistBefore().find('\n', begin) + 1 - begin);
    }
};

TEST_P(WithoutPermission, FailsWithATypeAndLosesNothing)
{
    prepare(folder() / "trial");
    trial().begin();
    for (const Lack &lack : lacks())
    {
        SCOPED_TRACE(lack.path);
        tryOnce(
            [&](const Action &action)
            {
                const Withheld withheld(lack.path, lack.mode);
                return runInChild(action);
            },
            otherGists(lack.path), losses(lack));
    }
    EXPECT_GT(failures(), 0);
}

INSTANTIATE_TEST_SUITE_P(Of, WithoutPermission,
                         testing::ValuesIn(vclink::test::operationsThatWrite()),
                         vclink::test::nameOfOperation);

} // namespace
