// SPDX-License-Identifier: MIT
#include <iterator>
#include <string>

#include <gtest/gtest.h>

#include "fl/filesystem/fstream.hpp"
#include "support/Files.hpp"

using fl::filesystem::basic_ifstream;
using fl::filesystem::basic_ofstream;

namespace
{

constexpr auto binaryIn = std::ios_base::in | std::ios_base::binary;
constexpr auto binaryOut = std::ios_base::out | std::ios_base::binary;

class FileStreams : public testing::Test
{
  protected:
    static std::string readAll(std::istream &stream)
    {
        return {std::istreambuf_iterator<char>(stream), std::istreambuf_iterator<char>()};
    }

    const vclink_host_tests::Folder folder{};
};

TEST_F(FileStreams, WriteAndReadEveryByteUnderAnyName)
{
    std::string bytes;
    for (std::size_t index = 0; index < 100000; ++index)
        bytes += static_cast<char>(index * 7 + index / 256);
    for (const std::string name : {"data", "\xC3\xA4\xE6\x97\xA5\xF0\x9F\x98\x80"})
    {
        {
            basic_ofstream<char> out(folder.ufile(name), binaryOut);
            ASSERT_TRUE(out.is_open());
            out.write(bytes.data(), static_cast<std::streamsize>(bytes.size()));
            EXPECT_TRUE(out.good());
        }
        EXPECT_EQ(folder.read(name), bytes);
        basic_ifstream<char> in(folder.ufile(name), binaryIn);
        ASSERT_TRUE(in.is_open());
        EXPECT_EQ(readAll(in), bytes);
    }
}

TEST_F(FileStreams, ReadAnEmptyFileAsNothing)
{
    folder.write("empty", "");
    basic_ifstream<char> in(folder.ufile("empty"), binaryIn);
    EXPECT_TRUE(in.good());
    EXPECT_EQ(readAll(in), "");
}

TEST_F(FileStreams, EmptyAFileThatIsWrittenAnewAndKeepOneThatIsUpdated)
{
    const struct
    {
        std::ios_base::openmode mode;
        const char *content;
    } rows[] = {{binaryOut, "abc"}, {binaryOut | std::ios_base::in, "abc45"}};
    for (const auto &row : rows)
    {
        folder.write("data", "12345");
        basic_ofstream<char> out(folder.ufile("data"), row.mode);
        ASSERT_TRUE(out.is_open());
        out << "abc";
        out.close();
        EXPECT_TRUE(out.good());
        EXPECT_FALSE(out.is_open());
        EXPECT_EQ(folder.read("data"), row.content);
    }
}

TEST_F(FileStreams, FailWithoutRaisingOrMakingAFileThatCannotBeOpened)
{
    const auto update = binaryOut | std::ios_base::in;
    EXPECT_FALSE(basic_ofstream<char>(folder.ufile("missing"), update).is_open());
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

} // namespace
