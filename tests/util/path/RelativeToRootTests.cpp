// SPDX-License-Identifier: MIT
#include <algorithm>
#include <cstddef>
#include <filesystem>
#include <random>
#include <sstream>
#include <string>
#include <vector>

#include <boost/filesystem/exception.hpp>
#include <gtest/gtest.h>

#include "support/GitFixture.hpp"
#include "support/WorkingFolder.hpp"
#include "support/relativePath.hpp"
#include "support/text.hpp"
#include "util/path/paths.hpp"

namespace
{

namespace fs = std::filesystem;
using vclink::git::relativeToRoot;
using vclink::git::RootRelativePaths;
using namespace vclink::test;

/// What the operation is defined by.
std::string oracle(const std::string &root, const std::string &path)
{
    std::string text = relativeOfBoost174(path, root);
    std::replace(text.begin(), text.end(), '\\', '/');
    return text;
}

class RelativeToRoot : public GitFixture
{
  protected:
    RelativeToRoot()
    {
        for (const auto *made : {"root/sub/dir", "root/back\\slash", "other/deep"})
            fs::create_directories(folder() / made);
        const auto files = GitRepository(folder().path());
        for (const auto *file : {"root/file", "root/sub/file", "root/sub/dir/file", "other/file",
                                 "root/x\\y", "root/\xFF", "root/gr\xC3\xBC\xC3\x9F"})
            files.write(file, "x");
        files.symlink("root", "link");
        files.symlink("../other", "root/out");
        files.symlink("sub/file", "root/tofile");
        files.symlink("sub", "root/tofolder");
        files.symlink("nowhere", "root/dangling");
        files.symlink("sub/nowhere", "root/sub/../danglingbelow");
        files.symlink("loop", "root/loop");
        files.symlink("../link/sub", "other/roundabout");
    }

    std::string at(const std::string &name) const
    {
        return (folder() / name).string();
    }
    std::string relative(const std::string &root, const std::string &path) const
    {
        return asUtf8(relativeToRoot(asPath(at(root)), asPath(at(path))));
    }
};

TEST_F(RelativeToRoot, TakesTheRootOffAPath)
{
    const struct
    {
        const char *what;
        const char *path;
        const char *relative;
        const char *root = "root";
    } rows[] = {
        {"a file below it", "root/file", "file"},
        {"a file below it", "root/sub/dir/file", "sub/dir/file"},
        {"the root itself", "root", "."},
        {"the root itself", "root/", "."},
        {"the root itself", "root/.", "."},
        {"the root itself", "root/sub/..", "."},
        {"the root itself", "link", "."},
        {"the root itself", "link/", "."},
        {"leading dots for a path outside", "other/file", "../other/file"},
        {"leading dots for a path outside", "nowhere/at/all", "../nowhere/at/all"},
        {"leading dots for a path outside", "root", "..", "root/sub"},
        {"with the missing tail", "root/missing", "missing"},
        {"with the missing tail", "root/sub/missing/deep", "sub/missing/deep"},
        {"with the missing tail", "root/missing/../file", "file"},
        {"a root reached through a link", "root/sub/dir/file", "sub/dir/file", "link"},
        {"a root reached through a link", "link/sub/dir/file", "sub/dir/file"},
        {"a root reached through a link", "link/missing/x", "missing/x", "link"},
        {"links in every element", "root/tofile", "sub/file"},
        {"links in every element", "root/tofolder/file", "sub/file"},
        {"links in every element", "root/tofolder/missing", "sub/missing"},
        {"links in every element", "root/out/file", "../other/file"},
        {"links in every element", "other/roundabout/file", "sub/file"},
        {"slashes for backslashes", "root/x\\y", "x/y"},
        {"slashes for backslashes", "root/back\\slash", "back/slash"},
        {"slashes for backslashes", "root/\\", "/"},
        {"bytes that are not UTF-8", "root/\xFF", "\xFF"},
        {"bytes that are not UTF-8", "root/missing\xFE/x", "missing\xFE/x"},
    };
    for (const auto &row : rows)
        EXPECT_EQ(relative(row.root, row.path), row.relative) << row.what << ": " << row.path;
}

TEST_F(RelativeToRoot, GivesAnEmptyTextWhereTheTwoCannotBeRelated)
{
    EXPECT_EQ(asUtf8(relativeToRoot(asPath(at("root")), upath())), "");
    EXPECT_EQ(asUtf8(relativeToRoot(asPath(at("root")), asPath("missing/relative"))), "");
    EXPECT_EQ(asUtf8(relativeToRoot(upath(), asPath(at("root/file")))), "");
}

/// Paths of every kind.
std::vector<std::string> shapes()
{
    std::vector<std::string> paths;
    std::istringstream list(
        "|root|root/|root/.|root/..|root/file|root//file|root/./file|root/sub/|root/sub/.|"
        "root/sub//|root/sub/../file|root/sub/dir/file|root/sub/missing/deep|root/missing/|"
        "root/missing/.|root/missing/..|root/missing/../file|root/missing/./x/..|root/tofile|"
        "root/tofolder|root/tofolder/|root/tofolder/../file|root/tofolder/missing|root/dangling|"
        "root/dangling/x|root/danglingbelow|root/danglingbelow/x|root/out|root/out/file|"
        "root/out/../file|root/out/deep/../../root/file|root/x\\y|root/\xFF|"
        "root/gr\xC3\xBC\xC3\x9F|root/file/x|link|link/file|link/../root/file|other|other/"
        "roundabout|"
        "other/roundabout/file|other/roundabout/dir/file|nowhere/at/all|nowhere/deep/..|root/ |"
        "root/a b|root/*|root/...");
    for (std::string path; std::getline(list, path, '|');)
        paths.push_back(path);
    return paths;
}

TEST_F(RelativeToRoot, AgreesWithItsDefinitionOnManyShapes)
{
    const std::vector<std::string> roots{
        "root",  "root/",       "root//",        "root/.",  "root/sub",  "link",
        "link/", "link/sub/..", "other/../root", "missing", "root/file", "root/back\\slash"};
    for (const auto &root : roots)
    {
        RootRelativePaths list(asPath(at(root)));
        for (const auto &path : shapes())
        {
            const std::string expected = oracle(at(root), at(path));
            EXPECT_EQ(relative(root, path), expected) << root << " and " << path;
            EXPECT_EQ(list.relative(asPath(at(path))), expected)
                << root << " and " << path << " as one of a list";
        }
    }
}

TEST_F(RelativeToRoot, AgreesWithItsDefinitionOnRelativePaths)
{
    for (const std::string root : {"", ".", "missing", "/", "/proc"})
    {
        for (const std::string path :
             {"", ".", "..", "missing", "./missing", "missing/..", "/", "/proc/self", "/missing"})
        {
            EXPECT_EQ(asUtf8(relativeToRoot(asPath(root), asPath(path))), oracle(root, path))
                << '"' << root << "\" and \"" << path << '"';
        }
    }
}

/// Paths put together at random of elements of every kind, as one list: what was found out for one
/// of them must not spoil another.
TEST_F(RelativeToRoot, AgreesWithItsDefinitionOnRandomPaths)
{
    const std::vector<std::string> elements{
        "root", "sub", "dir",     "file", "out",  "tofolder",   "tofile", "dangling", "link", ".",
        "..",   "",    "missing", "..x",  "x\\y", "roundabout", "other",  "deep",     "\xFF"};
    std::minstd_rand random(20200101);
    std::uniform_int_distribution<std::size_t> pick(0, elements.size() - 1);
    for (const std::string root : {"root", "link", "root/sub", "root/tofolder"})
    {
        RootRelativePaths list(asPath(at(root)));
        for (int i = 0; i < 1000; ++i)
        {
            std::string path = i % 2 == 0 ? root : "other";
            for (std::size_t depth = pick(random) % 6; depth > 0; --depth)
                path += "/" + elements[pick(random)];
            EXPECT_EQ(list.relative(asPath(at(path))), oracle(at(root), at(path)))
                << root << " and " << path;
        }
    }
}

/// The working folder of a process may be deleted, which is nothing to an absolute path.
TEST_F(RelativeToRoot, NeedsNoWorkingFolderForAbsolutePaths)
{
    for (const std::string root : {"root", "link", "root/sub", "root/missing", "nowhere/"})
    {
        std::vector<std::string> expected;
        for (const std::string &path : shapes())
            expected.push_back(relative(root, path));
        const NoWorkingFolder gone(folder().path());
        for (std::size_t i = 0; i < shapes().size(); ++i)
            EXPECT_EQ(relative(root, shapes()[i]), expected[i]) << root << " and " << shapes()[i];
        EXPECT_THROW(relative(root, "root/loop"), boost::filesystem::filesystem_error);
        EXPECT_THROW(relative(root, "root/" + std::string(300, 'n')),
                     boost::filesystem::filesystem_error);
        EXPECT_EQ(asUtf8(relativeToRoot(asPath("/"), asPath("/missing"))), "missing");
        EXPECT_THROW(relativeToRoot(asPath(at(root)), asPath(".")),
                     boost::filesystem::filesystem_error);
    }
}

TEST_F(RelativeToRoot, RaisesForWhatCannotBeResolvedOnALoopWithTheCodeOfItsDefinition)
{
    const auto codeOf = [](const auto &action)
    {
        try
        {
            action();
        }
        catch (const boost::filesystem::filesystem_error &error)
        {
            return error.code();
        }
        return boost::system::error_code();
    };
    const std::string tooLong(300, 'n');
    std::string manyElements = "root";
    for (int i = 0; i < 100'000; ++i)
        manyElements += "/d";
    const std::pair<std::string, std::string> rows[] = {
        {"root", "root/" + tooLong}, {"root", "root/sub/" + tooLong + "/file"},
        {"root", manyElements},      {"root", "root/loop"},
        {"root", "root/loop/file"},  {"root/loop", "root/file"}};
    for (const auto &[root, path] : rows)
    {
        const auto code = codeOf([&, &from = root, &to = path] { relative(from, to); });
        EXPECT_TRUE(code) << path.substr(0, 100);
    }
    EXPECT_EQ(codeOf([&] { relative("root", "root/loop"); }),
              codeOf([&] { oracle(at("root"), at("root/loop")); }));
}

TEST_F(RelativeToRoot, ResolvesTheRootOfSeveralPathsOnce)
{
    RootRelativePaths paths(asPath(at("link")));
    EXPECT_EQ(paths.relative(asPath(at("root/file"))), "file");
    fs::remove(folder() / "link");
    fs::create_directory_symlink("other", folder() / "link");
    EXPECT_EQ(paths.relative(asPath(at("root/sub/file"))), "sub/file");
    EXPECT_EQ(paths.relative(asPath(at("link/file"))), "../other/file");
}

} // namespace
