// SPDX-License-Identifier: MIT
#include <iterator>
#include <string>

#include <gtest/gtest.h>

#include "fl/filesystem/fstream.hpp"
#include "support/TemporaryFolder.hpp"

using fl::filesystem::basic_ifstream;
using fl::filesystem::basic_ofstream;
using vclink_host_tests::readFile;
using vclink_host_tests::TemporaryFolder;
using vclink_host_tests::writeFile;

namespace
{

constexpr auto binaryIn = std::ios_base::in | std::ios_base::binary;
constexpr auto binaryOut = std::ios_base::out | std::ios_base::binary;

std::string makeBytes(std::size_t count)
{
    std::string bytes;
    for (std::size_t index = 0; index < count; ++index)
    {
        bytes += static_cast<char>(index * 7 + index / 256);
    }
    return bytes;
}

std::string readAll(std::istream &stream)
{
    return {std::istreambuf_iterator<char>(stream), std::istreambuf_iterator<char>()};
}

} // namespace

TEST(FileStreams, WriteAndReadEveryByte)
{
    const TemporaryFolder folder;
    const std::string bytes = makeBytes(100000);
    {
        basic_ofstream<char> out(folder.ufile("data"), binaryOut);
        ASSERT_TRUE(out.is_open());
        out.write(bytes.data(), static_cast<std::streamsize>(bytes.size()));
        EXPECT_TRUE(out.good());
    }
    EXPECT_EQ(readFile(folder.file("data")), bytes);
    basic_ifstream<char> in(folder.ufile("data"), binaryIn);
    ASSERT_TRUE(in.is_open());
    EXPECT_EQ(readAll(in), bytes);
}

TEST(FileStreams, ReadAnEmptyFileAsNothing)
{
    const TemporaryFolder folder;
    writeFile(folder.file("empty"), "");
    basic_ifstream<char> in(folder.ufile("empty"), binaryIn);
    EXPECT_TRUE(in.good());
    EXPECT_EQ(readAll(in), "");
}

TEST(FileStreams, EmptyAFileThatIsWrittenAnew)
{
    const TemporaryFolder folder;
    writeFile(folder.file("data"), "a long text that was here before");
    basic_ofstream<char> out(folder.ufile("data"), binaryOut);
    out << "new";
    out.close();
    EXPECT_TRUE(out.good());
    EXPECT_FALSE(out.is_open());
    EXPECT_EQ(readFile(folder.file("data")), "new");
}

TEST(FileStreams, FailWithoutRaisingWhenAFileCannotBeOpened)
{
    const TemporaryFolder folder;
    basic_ifstream<char> in(folder.ufile("missing"), binaryIn);
    EXPECT_FALSE(in.is_open());
    EXPECT_TRUE(in.fail());
    EXPECT_EQ(readAll(in), "");
    basic_ofstream<char> out(folder.ufile("missing/data"), binaryOut);
    EXPECT_FALSE(out.is_open());
    EXPECT_TRUE(out.fail());
    out << "nobody reads this";
    EXPECT_TRUE(out.fail());
}

TEST(FileStreams, MakeNoFileWhenTheyAreToUpdateOne)
{
    const TemporaryFolder folder;
    const auto update = binaryOut | std::ios_base::in;
    EXPECT_FALSE(basic_ofstream<char>(folder.ufile("missing"), update).is_open());
    EXPECT_FALSE(basic_ifstream<char>(folder.ufile("missing"), binaryIn).is_open());
    writeFile(folder.file("data"), "12345");
    basic_ofstream<char> out(folder.ufile("data"), update);
    ASSERT_TRUE(out.is_open());
    out << "abc";
    out.close();
    EXPECT_TRUE(out.good());
    EXPECT_EQ(readFile(folder.file("data")), "abc45");
}

TEST(FileStreams, OpenNamesOutsideAscii)
{
    const TemporaryFolder folder;
    const std::string name = "\xC3\xA4\xE6\x97\xA5\xF0\x9F\x98\x80";
    {
        basic_ofstream<char> out(folder.ufile(name), binaryOut);
        out << "text";
    }
    EXPECT_EQ(readFile(folder.file(name)), "text");
}
